#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

namespace pelorin::imgproc {

/// A whole file in memory; pipes and devices are read to their end.
/// @throws std::system_error when it cannot be opened or read (a directory included), or is over
///         2 GiB.
std::vector<std::uint8_t> readFile(const std::string& path);

/// Replaces `path` in one step: writes a temporary in the same folder, then renames it. On failure
/// the old file is untouched and nothing is left behind. A replaced file keeps its permissions, a
/// symbolic link stays and the file it names is replaced. Pipes and devices are written directly.
///
/// A process that wants "file too large" as an error rather than as its end ignores SIGXFSZ, and
/// SIGPIPE likewise.
/// @throws std::system_error when it cannot be written.
void writeFileAtomically(const std::string& path, std::span<const std::uint8_t> bytes);

}  // namespace pelorin::imgproc
