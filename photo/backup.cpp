#include "photo/backup.h"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <filesystem>
#include <iterator>
#include <string_view>
#include <system_error>

#include "photo/file_io.h"

namespace fs = std::filesystem;

namespace pelorin::photo {
namespace {

// Tells a folder of backups from others, whose files would go astray.
constexpr const char* markName = ".quenby-backup";

void markFolder(const fs::path& folder) {
  constexpr std::string_view text =
      "Photos that quenby replaced in place; quenby undo puts them back.\n";
  std::error_code ignored;
  if (fs::exists(folder / markName, ignored)) return;
  sweepLeftovers(folder.string());
  writeFileAtomically((folder / markName).string(),
                      {reinterpret_cast<const std::uint8_t*>(text.data()), text.size()});
}

fs::path placeIn(const std::string& folder, const fs::path& path) {
  return fs::path(folder) / path.relative_path();
}

[[noreturn]] void throwError(int code, const fs::path& path) {
  throw std::system_error(code, std::generic_category(), path.string());
}

void copyWhole(const std::string& from, const std::string& to) {
  writeFileAtomically(to, readFile(from), {.keepTimes = true, .like = from});
}

}  // namespace

std::string backupPath(const std::string& folder, const std::string& path) {
  return placeIn(folder, fs::canonical(path)).string();
}

bool isReplaced(const std::string& folder, const std::string& path) {
  const std::string backup = backupPath(folder, path);
  std::error_code ignored;
  if (!fs::exists(backup, ignored) || fs::equivalent(backup, path, ignored)) return false;
  return readFile(backup) != readFile(path);
}

void keepBackup(const std::string& folder, const std::string& path) {
  const fs::path original = fs::canonical(path);
  const fs::path backup = placeIn(folder, original);
  fs::create_directories(backup.parent_path());
  markFolder(folder);
  if (::link(original.c_str(), backup.c_str()) == 0) {
    syncFolder(backup.parent_path().string());
  } else if (errno == EEXIST) {
    if (isReplaced(folder, path)) throwError(EEXIST, backup);
  } else {
    copyWhole(original.string(), backup.string());
  }
}

bool isBackupFolder(const std::string& folder) {
  return fs::is_directory(folder) &&
         (fs::is_empty(folder) || fs::exists(fs::path(folder) / markName));
}

std::vector<std::string> keptFiles(const std::string& folder) {
  std::vector<std::string> paths;
  sweepLeftovers(folder);
  for (const fs::directory_entry& entry : fs::recursive_directory_iterator(folder)) {
    if (entry.is_directory()) sweepLeftovers(entry.path().string());
    if (!entry.is_regular_file() || entry.path().filename() == markName) continue;
    paths.push_back((fs::path("/") / entry.path().lexically_relative(folder)).string());
  }
  std::sort(paths.begin(), paths.end());
  return paths;
}

void restoreBackup(const std::string& folder, const std::string& path) {
  const fs::path backup = placeIn(folder, path);
  if (::rename(backup.c_str(), path.c_str()) == 0) {
    // Two names of one file are both left by a rename.
    ::unlink(backup.c_str());
    syncFolder(fs::path(path).parent_path().string());
  } else if (errno == EXDEV) {
    copyWhole(backup.string(), path);
    ::unlink(backup.c_str());
  } else {
    throwError(errno, path);
  }
  std::error_code notEmpty;
  for (fs::path above = backup.parent_path(); above != folder && !above.empty();
       above = above.parent_path()) {
    if (!fs::remove(above, notEmpty)) break;
  }
  const fs::directory_iterator entries(folder);
  if (std::distance(entries, {}) == 1) fs::remove(fs::path(folder) / markName, notEmpty);
}

}  // namespace pelorin::photo
