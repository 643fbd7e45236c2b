#pragma once

#include <chrono>
#include <cstdint>
#include <span>
#include <stop_token>
#include <string>
#include <vector>

#include "photo/decode_limits.h"
#include "photo/descriptor.h"
#include "photo/file_view.h"
#include "photo/temporaries.h"

namespace pelorin::photo {

/// How long to wait for others.
struct Waiting {
  std::stop_token stop = {};  ///< Ends any waiting; the default never does.
  /// How long a named pipe may have nobody at its other end.
  std::chrono::milliseconds patience = std::chrono::seconds(10);
};

struct ReadOptions {
  std::uint64_t largest = DecodeLimits{}.bytes;  ///< Bytes that are read at most.
  Waiting wait = {};
};

/// A whole file in memory; pipes and devices are read to their end.
/// @throws std::system_error when it cannot be opened or read (a directory included); PhotoError when
///         it is too large, which of a file is known before it is read, and when nobody writes to a
///         pipe; Stopped while waiting.
std::vector<std::uint8_t> readFile(const std::string& path, const ReadOptions& options = {});

/// The same of an open file, such as standard input, which stays open.
std::vector<std::uint8_t> readDescriptor(int descriptor, const std::string& path,
                                         const ReadOptions& options = {});

/// What becomes of a file that is there already.
struct ReplaceOptions {
  bool mayReplace = true;  ///< Else it stays, and to replace it is an error (EEXIST).
  bool keepTimes = false;  ///< The new file has its times of access and change.
  std::string like = {};   ///< The file whose times, permissions and so on count instead.
  std::string timesOf =
      {};             ///< Another file whose times the new one has, whatever `keepTimes` says.
  Waiting wait = {};  ///< For whoever reads, where that is a pipe.
};

/// A file that is written beside another and then takes its place. A replaced file keeps its
/// permissions and extended attributes, and its owner where allowed; a symbolic link stays and the
/// file it names is replaced. Pipes, devices and files without a name are written directly.
///
/// The data is on the disk before it takes its place, so that a power cut leaves the old file or
/// the new one. A process that is killed leaves a temporary behind, which `sweepLeftovers` removes.
///
/// A process that wants "file too large" as an error rather than as its end ignores SIGXFSZ, and
/// SIGPIPE likewise.
class Replacement {
 public:
  /// Writes `bytes` to a temporary in the folder of `path`.
  /// @throws std::system_error when it cannot be written; nothing is then left behind.
  Replacement(const std::string& path, const FileView& bytes, const ReplaceOptions& options = {});
  /// Removes the temporary, unless it has taken its place.
  ~Replacement();
  Replacement(const Replacement&) = delete;
  Replacement& operator=(const Replacement&) = delete;

  /// Takes the place, once. Allocates nothing unless it throws.
  /// @throws std::system_error when that fails, or when a file is there that may not be replaced,
  ///         even since a moment ago; the old file is untouched.
  void replace();

 private:
  Replacement() = default;

  std::string target_, temporary_, folder_;  // all empty when written directly
  bool mayReplace_ = true;
  RecordedTemporary recorded_;
  int lock_ = -1;  // the open temporary: others see from it that it is in use
};

/// Replaces `path` in one step: a `Replacement` that takes its place at once.
/// @throws std::system_error when it cannot be written; the old file is then untouched and nothing
///         is left behind.
void writeFileAtomically(const std::string& path, const FileView& bytes,
                         const ReplaceOptions& options = {});

/// A new file in `folder` ("" is the current one) to write and read, which has no name and is gone once
/// it is closed. @throws std::system_error.
Descriptor unnamedTemporary(const std::string& folder);

/// The rename that fails where there is a file (EEXIST), in one step.
/// @returns 0, or -1 with `errno`.
int renameToNew(const char* from, const char* to);

/// Makes sure that the names in a folder are on the disk, where its file system can. Never fails.
void syncFolder(const std::string& folder);

/// Removes the temporaries that killed processes left in `folder` ("" is the current one). Those
/// that a process still writes stay. Never fails: what cannot be removed stays.
void sweepLeftovers(const std::string& folder);

}  // namespace pelorin::photo
