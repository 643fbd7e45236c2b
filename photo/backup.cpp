#include "photo/backup.h"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <filesystem>
#include <stdexcept>
#include <string_view>
#include <system_error>

#include "photo/descriptor.h"
#include "photo/file_io.h"
#include "photo/metadata/md5.h"

namespace fs = std::filesystem;

namespace pelorin::photo {
namespace {

[[noreturn]] void throwError(int code, const fs::path& path) {
  throwSystemError(code, path.string());
}

// Tells a folder of backups from others, whose files would go astray.
struct Mark {
  const char* name;
  std::string_view text;
};
constexpr Mark replacedMark = {
    ".quenby-backup", "Photos that quenby replaced in place; quenby undo puts them back.\n"};
constexpr Mark movedMark = {".quenby-moved",
                            "Photos that quenby moved away; quenby undo puts them back.\n"};

bool hasMark(const fs::path& folder, const Mark& mark) {
  std::error_code ignored;
  return fs::exists(folder / mark.name, ignored);
}

// What photos became, for whoever puts the old ones back: a digest, a space and a path between NULs
// each. Only ever added to, so that what is lost of it by a power cut is its end.
constexpr const char* resultsName = ".quenby-results";

bool isMarkName(const fs::path& name) {
  return name == replacedMark.name || name == movedMark.name || name == resultsName;
}

std::string recordOf(const std::string& path, const FileView& file) {
  const std::string nul(1, '\0');
  Md5 sum;
  sum.add(file.bytes);
  if (file.rest != nullptr) {
    forEachBlock(*file.rest, [&](std::span<const std::uint8_t> block) { sum.add(block); });
  }
  return nul + sum.hex() + " " + path + nul;
}

bool wasRecorded(const std::vector<std::uint8_t>& list, const std::string& path) {
  const std::string end = " " + path + '\0';
  return std::search(list.begin(), list.end(), end.begin(), end.end()) != list.end();
}

// Kept by a run that was killed before it noted what would become of the file.
bool isUnreplaced(const fs::path& backup, const std::string& path) {
  std::error_code failed;
  if (fs::equivalent(backup, path, failed)) return true;
  const std::uintmax_t size = fs::file_size(path, failed);
  return !failed && size == fs::file_size(backup, failed) && !failed &&
         readFile(backup.string()) == readFile(path);
}

void markFolder(const fs::path& folder, const Mark& mark) {
  if (hasMark(folder, mark)) return;
  const Mark& other = &mark == &movedMark ? replacedMark : movedMark;
  if (hasMark(folder, other)) {
    throw std::runtime_error(folder.string() + " keeps photos that were " +
                             (&mark == &movedMark ? "replaced" : "moved") +
                             "; name another folder");
  }
  sweepLeftovers(folder.string());
  writeFileAtomically((folder / mark.name).string(),
                      {reinterpret_cast<const std::uint8_t*>(mark.text.data()), mark.text.size()});
}

fs::path placeIn(const std::string& folder, const fs::path& path) {
  return fs::path(folder) / path.relative_path();
}

// The mark comes first: until it is there, nothing else is in the folder.
void makeRoom(const std::string& folder, const fs::path& backup, const Mark& mark) {
  fs::create_directories(folder);
  markFolder(folder, mark);
  fs::create_directories(backup.parent_path());
}

void copyWhole(const std::string& from, const std::string& to, bool mayReplace) {
  writeFileAtomically(to, readFile(from),
                      {.mayReplace = mayReplace, .keepTimes = true, .like = from});
}

// What this process is about to lose is read again from where it stands now.
void removeCopied(const std::string& file, const std::string& copy) {
  if (readFile(file) != readFile(copy)) {
    throw std::runtime_error(copy + " is another file; name another folder");
  }
  if (::unlink(file.c_str()) != 0) throwError(errno, file);
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
  makeRoom(folder, backup, replacedMark);
  if (::link(original.c_str(), backup.c_str()) == 0) {
    syncFolder(backup.parent_path().string());
  } else if (errno == EEXIST) {
    if (isReplaced(folder, path)) {
      throw std::runtime_error(backup.string() +
                               " keeps another content of it already; name another folder");
    }
  } else {
    copyWhole(original.string(), backup.string(), /*mayReplace=*/true);
  }
}

void recordResult(const std::string& folder, const std::string& path, const FileView& file) {
  const std::string record = recordOf(fs::canonical(path).string(), file);
  const std::string results = (fs::path(folder) / resultsName).string();
  const Descriptor list(results, O_WRONLY | O_APPEND | O_CREAT, 0600);
  // In one call, so that runs at the same time do not mix theirs.
  const ssize_t count = ::write(list.get(), record.data(), record.size());
  if (count != static_cast<ssize_t>(record.size())) throwError(count < 0 ? errno : ENOSPC, results);
  if (::fdatasync(list.get()) != 0 && errno != EINVAL) throwError(errno, results);
}

bool isChangedSince(const std::string& folder, const std::string& path) {
  std::error_code ignored;
  const fs::path backup = placeIn(folder, path);
  if (hasMark(folder, movedMark) || !fs::exists(path, ignored)) return false;
  if (fs::equivalent(backup, path, ignored)) return false;
  const std::vector<std::uint8_t> now = readFile(path);
  if (fs::file_size(backup, ignored) == now.size() && readFile(backup.string()) == now) {
    return false;
  }
  const std::string results = (fs::path(folder) / resultsName).string();
  if (!fs::exists(results, ignored)) return true;
  const std::vector<std::uint8_t> list = readFile(results);
  const std::string record = recordOf(path, now);
  return std::search(list.begin(), list.end(), record.begin(), record.end()) == list.end();
}

void moveToBackups(const std::string& folder, const std::string& path) {
  const fs::path whole = fs::absolute(path);
  const fs::path original = fs::canonical(whole.parent_path()) / whole.filename();
  if (!fs::is_regular_file(fs::symlink_status(original))) throwError(EINVAL, original);
  const fs::path backup = placeIn(folder, original);
  makeRoom(folder, backup, movedMark);
  if (renameToNew(original.c_str(), backup.c_str()) != 0) {
    if (errno != EXDEV && errno != EEXIST) throwError(errno, backup);
    // What a run left that was killed between copying and removing is as good as a copy of this one.
    if (!fs::exists(backup)) copyWhole(original.string(), backup.string(), /*mayReplace=*/false);
    syncFolder(backup.parent_path().string());
    removeCopied(original.string(), backup.string());
  }
  syncFolder(backup.parent_path().string());
  syncFolder(original.parent_path().string());
}

bool isBackupFolder(const std::string& folder) {
  if (!fs::is_directory(folder)) return false;
  sweepLeftovers(folder);
  return (fs::is_empty(folder) || hasMark(folder, replacedMark) || hasMark(folder, movedMark));
}

std::vector<std::string> keptFiles(const std::string& folder) {
  std::vector<std::string> paths;
  sweepLeftovers(folder);
  std::vector<std::uint8_t> list;
  const std::string results = (fs::path(folder) / resultsName).string();
  if (fs::exists(results)) list = readFile(results);
  const bool isOfMoved = hasMark(folder, movedMark);
  for (const fs::directory_entry& entry : fs::recursive_directory_iterator(folder)) {
    if (entry.is_directory()) sweepLeftovers(entry.path().string());
    if (!entry.is_regular_file() || isMarkName(entry.path().filename())) continue;
    std::string path = (fs::path("/") / entry.path().lexically_relative(folder)).string();
    if (isOfMoved || list.empty() || wasRecorded(list, path) || isUnreplaced(entry.path(), path))
      paths.push_back(std::move(path));
  }
  std::sort(paths.begin(), paths.end());
  return paths;
}

void restoreBackup(const std::string& folder, const std::string& path) {
  const fs::path backup = placeIn(folder, path);
  const bool wasMoved = hasMark(folder, movedMark);
  if (wasMoved) fs::create_directories(fs::path(path).parent_path());
  if ((wasMoved ? renameToNew : ::rename)(backup.c_str(), path.c_str()) == 0) {
    // Two names of one file are both left by a rename.
    ::unlink(backup.c_str());
    syncFolder(fs::path(path).parent_path().string());
  } else if (wasMoved && errno == EEXIST) {
    throw std::runtime_error("there is a file of that name now; move it away first");
  } else if (errno == EXDEV) {
    copyWhole(backup.string(), path, /*mayReplace=*/!wasMoved);
    removeCopied(backup.string(), path);
  } else {
    throwError(errno, path);
  }
  std::error_code notEmpty;
  for (fs::path above = backup.parent_path(); above != folder && !above.empty();
       above = above.parent_path()) {
    if (!fs::remove(above, notEmpty)) break;
  }
  const fs::directory_iterator entries(folder);
  const bool onlyOurs = std::all_of(begin(entries), end(entries), [](const auto& entry) {
    return isMarkName(entry.path().filename());
  });
  if (!onlyOurs) return;
  for (const char* name : {resultsName, replacedMark.name, movedMark.name}) {
    fs::remove(fs::path(folder) / name, notEmpty);
  }
}

}  // namespace pelorin::photo
