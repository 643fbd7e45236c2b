#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

namespace pelorin::photo {

/// A whole file in memory; pipes and devices are read to their end.
/// @throws std::system_error when it cannot be opened or read (a directory included), or is over
///         2 GiB.
std::vector<std::uint8_t> readFile(const std::string& path);

/// A file that is written beside another and then takes its place. A replaced file keeps its
/// permissions, a symbolic link stays and the file it names is replaced. Pipes, devices and files
/// without a name are written directly.
///
/// A process that wants "file too large" as an error rather than as its end ignores SIGXFSZ, and
/// SIGPIPE likewise.
class Replacement {
 public:
  /// Writes `bytes` to a temporary in the folder of `path`.
  /// @throws std::system_error when it cannot be written; nothing is then left behind.
  Replacement(const std::string& path, std::span<const std::uint8_t> bytes);
  /// Removes the temporary, unless it has taken its place.
  ~Replacement();
  Replacement(const Replacement&) = delete;
  Replacement& operator=(const Replacement&) = delete;

  /// Takes the place, once. Allocates nothing unless it throws.
  /// @throws std::system_error when that fails; the old file is untouched.
  void replace();

 private:
  Replacement() = default;

  std::string target_, temporary_;  // both empty when written directly
};

/// Replaces `path` in one step: a `Replacement` that takes its place at once.
/// @throws std::system_error when it cannot be written; the old file is then untouched and nothing
///         is left behind.
void writeFileAtomically(const std::string& path, std::span<const std::uint8_t> bytes);

}  // namespace pelorin::photo
