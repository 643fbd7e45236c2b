#pragma once

#include <string>
#include <vector>

#include "photo/file_view.h"

namespace pelorin::photo {

// A folder of backups holds files under the whole paths they had: it needs no list that could be
// lost, and what stands in it can be put back by hand. A file of its own tells it from other folders:
// ".quenby-backup" where photos were replaced, ".quenby-moved" where they were moved away.

/// Where `folder` keeps the file at `path`, links followed.
/// @throws std::filesystem::filesystem_error when there is no such file.
std::string backupPath(const std::string& folder, const std::string& path);

/// Whether `folder` keeps another content of the file at `path` than it has now, so that it has been
/// replaced since. @throws as above and as `readFile`.
bool isReplaced(const std::string& folder, const std::string& path);

/// Keeps the file at `path` in `folder`, on the disk before this returns: as a second name of it or,
/// on another disk, as a copy with its times, permissions and attributes. Meant for files that are
/// replaced next, not written into. Nothing is done where it is kept already.
/// @throws std::system_error, std::runtime_error where it keeps another content of it; nothing is then
///         left behind but empty folders.
void keepBackup(const std::string& folder, const std::string& path);

/// Moves the file at `path`, itself and no link to it, into `folder`, on the disk before this
/// returns: by its name or, to another disk, as a copy with its times, permissions and attributes that
/// was read again before the file goes. At every moment one of the two is whole.
/// @throws std::system_error, std::runtime_error where another file has that place in `folder`; the
///         file is then where it was.
void moveToBackups(const std::string& folder, const std::string& path);

/// Notes in `folder`, on the disk before this returns, what the file at `path` that it keeps is about to
/// become. @throws std::system_error; what reading the rest of `file` throws.
void recordResult(const std::string& folder, const std::string& path, const FileView& file);

/// Whether putting back the file that was at `path` would destroy what another program has made of
/// it: it has neither the content that `folder` keeps nor one that was recorded.
/// @throws as `readFile`.
bool isChangedSince(const std::string& folder, const std::string& path);

/// Whether `folder` is one of backups, or empty; what killed processes left in it goes.
/// @throws std::filesystem::filesystem_error.
bool isBackupFolder(const std::string& folder);

/// The paths of the files that `folder` keeps, sorted; what killed processes left in it goes. Files that
/// somebody else put into one of replaced photos are none.
/// @throws std::filesystem::filesystem_error.
std::vector<std::string> keptFiles(const std::string& folder);

/// Puts the file that was at `path` back, in one step, and takes it out of `folder`. It takes the place
/// of what replaced it; where it was moved away, the place must be free.
/// @throws std::system_error, std::runtime_error where the place is taken; the file at `path` and the
///         backup are then as they were.
void restoreBackup(const std::string& folder, const std::string& path);

}  // namespace pelorin::photo
