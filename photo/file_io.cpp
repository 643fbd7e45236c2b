#include "photo/file_io.h"

#include <fcntl.h>
#include <linux/fs.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <cctype>
#include <cerrno>
#include <filesystem>
#include <string>
#include <string_view>
#include <system_error>
#include <utility>

#include "photo/descriptor.h"
#include "photo/file_size.h"
#include "photo/photo_error.h"
#include "photo/stream_io.h"

namespace fs = std::filesystem;

namespace pelorin::photo {
namespace {

// A temporary is called so, with numbers between the two.
constexpr std::string_view temporaryStart = ".quenby-", temporaryEnd = ".tmp";

void writeAll(Descriptor& file, const std::string& path, std::span<const std::uint8_t> bytes) {
  while (!bytes.empty()) {
    const ssize_t count = ::write(file.get(), bytes.data(), bytes.size());
    if (count >= 0) {
      bytes = bytes.subspan(static_cast<std::size_t>(count));
    } else if (errno != EINTR) {
      throwSystemError(errno, path);
    }
  }
}

// Where no error can be told from now on, or where there is nothing to make sure of.
bool cannotBeSynced(int code) {
  return code == EINVAL || code == ENOTSUP || code == EROFS || code == ENOSYS;
}

void sync(const Descriptor& file, const std::string& path) {
  while (::fsync(file.get()) != 0) {
    if (cannotBeSynced(errno)) return;
    if (errno != EINTR) throwSystemError(errno, path);
  }
}

// The file that `path` names after following symbolic links, which need not exist.
fs::path linkTarget(fs::path path) {
  constexpr int mostLinks = 40;
  std::error_code ignored;
  for (int links = 0; fs::is_symlink(fs::symlink_status(path, ignored)); ++links) {
    if (links == mostLinks) throwSystemError(ELOOP, path);
    path = path.parent_path() / fs::read_symlink(path);
  }
  return path;
}

bool isNotAllowed(int code) {
  return code == EPERM || code == EACCES || code == ENOTSUP || code == ENODATA;
}

// Attributes that only the system may write, and those of systems that have none, are passed over.
void copyAttributes(const std::string& from, const Descriptor& to, const std::string& path) {
  std::string names, value;
  for (;;) {
    const ssize_t size = ::listxattr(from.c_str(), nullptr, 0);
    if (size <= 0) return;
    names.resize(static_cast<std::size_t>(size));
    const ssize_t listed = ::listxattr(from.c_str(), names.data(), names.size());
    if (listed < 0 && errno == ERANGE) continue;  // more than a moment ago
    names.resize(static_cast<std::size_t>(std::max<ssize_t>(listed, 0)));
    break;
  }
  for (std::size_t at = 0; at < names.size();
       at += std::string_view(names.c_str() + at).size() + 1) {
    const char* const name = names.c_str() + at;
    value.resize(65536);  // the most that the system takes
    const ssize_t size = ::getxattr(from.c_str(), name, value.data(), value.size());
    if (size < 0) continue;
    const auto count = static_cast<std::size_t>(size);
    if (::fsetxattr(to.get(), name, value.data(), count, 0) != 0 && !isNotAllowed(errno)) {
      throwSystemError(errno, path);
    }
  }
}

// As the file to replace: owner as far as we may, permissions, attributes.
void takeAfter(const struct stat& old, const std::string& oldPath, const Descriptor& file,
               const std::string& path) {
  const bool keepsOwner = ::fchown(file.get(), old.st_uid, old.st_gid) == 0;
  const mode_t permissions = old.st_mode & (keepsOwner ? 07777 : 0777);
  if (::fchmod(file.get(), permissions) != 0) throwSystemError(errno, path);
  copyAttributes(oldPath, file, path);
}

void takeTimes(const struct stat& old, const Descriptor& file, const std::string& path) {
  const timespec times[] = {old.st_atim, old.st_mtim};
  if (::futimens(file.get(), times) != 0) throwSystemError(errno, path);
}

// A new empty file in `folder`, whose path `path` gets; locked, so that nobody takes it for left.
Descriptor makeTemporary(const fs::path& folder, mode_t mode, std::string& path,
                         RecordedTemporary& record) {
  static std::atomic<unsigned> counter = 0;
  for (;;) {
    std::string name = folder / (std::string(temporaryStart) + std::to_string(::getpid()) + "-" +
                                 std::to_string(counter++) + std::string(temporaryEnd));
    try {
      record.record(name);
      Descriptor file(name, O_RDWR | O_CREAT | O_EXCL, mode);
      path = std::move(name);
      ::flock(file.get(), LOCK_EX | LOCK_NB);
      struct stat made = {};
      // Somebody who sweeps may have come before the lock.
      if (::fstat(file.get(), &made) != 0 || made.st_nlink != 0) return file;
    } catch (const std::system_error& error) {
      if (error.code() != std::errc::file_exists) throw;
    }
  }
}

// A new empty file in `folder` that has no name.
Descriptor nameless(const std::string& folder, mode_t mode) {
  const std::string place = folder.empty() ? "." : folder;
  try {
    return Descriptor(place, O_TMPFILE | O_RDWR, mode);
  } catch (const std::system_error& error) {
    // File systems without it, or kernels that take it for something else.
    constexpr int unknown[] = {EOPNOTSUPP, EISDIR, ENOENT, EINVAL};
    if (std::ranges::find(unknown, error.code().value()) == std::end(unknown)) throw;
  }
  std::string path;
  RecordedTemporary recorded;
  Descriptor named = makeTemporary(place, mode, path, recorded);
  if (::unlink(path.c_str()) != 0) throwSystemError(errno, path);
  return named;
}

// What others may do with a new file in `folder`, as the process's mask or the folder's own rules have it.
mode_t usualPermissions(const std::string& folder) {
  const Descriptor probe = nameless(folder, 0666);
  struct stat made = {};
  if (::fstat(probe.get(), &made) != 0) throwSystemError(errno, folder);
  return made.st_mode & 0777;
}

bool isTemporaryName(std::string_view name) {
  if (name.size() <= temporaryStart.size() + temporaryEnd.size()) return false;
  if (!name.starts_with(temporaryStart) || !name.ends_with(temporaryEnd)) return false;
  name.remove_prefix(temporaryStart.size());
  name.remove_suffix(temporaryEnd.size());
  return std::all_of(name.begin(), name.end(), [](char c) {
    return c == '-' || std::isdigit(static_cast<unsigned char>(c)) != 0;
  });
}

}  // namespace

std::vector<std::uint8_t> readFile(const std::string& path, const ReadOptions& options) {
  return readDescriptor(Descriptor(path, O_RDONLY | O_NONBLOCK).get(), path, options);
}

std::vector<std::uint8_t> readDescriptor(int descriptor, const std::string& path,
                                         const ReadOptions& options) {
  struct stat status = {};
  if (::fstat(descriptor, &status) != 0) throwSystemError(errno, path);
  if (!S_ISREG(status.st_mode)) return readToEnd(descriptor, path, options);
  if (std::uint64_t(status.st_size) > options.largest) refuseFileSize(options.largest);
  // One byte more than there is, so that the end shows without growing.
  std::vector<std::uint8_t> bytes(std::size_t(status.st_size) + 1);
  std::size_t used = 0;
  for (;;) {
    if (options.wait.stop.stop_requested()) throw Stopped();
    if (used == bytes.size()) bytes.resize(used * 2);
    constexpr std::size_t most = std::size_t{1} << 26;  // between two looks at the stop token
    const ssize_t count =
        ::read(descriptor, bytes.data() + used, std::min(most, bytes.size() - used));
    if (count < 0 && errno != EINTR) throwSystemError(errno, path);
    if (count == 0) break;
    if (count > 0) used += static_cast<std::size_t>(count);
    if (used > options.largest) refuseFileSize(options.largest);
  }
  bytes.resize(used);
  return bytes;
}

// Delegates, so that the destructor also runs when this throws.
Replacement::Replacement(const std::string& path, const FileView& bytes,
                         const ReplaceOptions& options)
    : Replacement() {
  struct stat old = {};
  const bool exists = ::stat(path.c_str(), &old) == 0;
  if (exists && (!S_ISREG(old.st_mode) || old.st_nlink == 0)) {
    // Renaming over a device would put an ordinary file in its place; a file without a name, reached
    // through its descriptor, has none to take over.
    writeStream(path, wholeOf(bytes), options.wait);
    return;
  }
  if (exists && !options.mayReplace) throwSystemError(EEXIST, path);
  // The rename needs only the folder; a protected file stays protected all the same.
  if (exists && ::faccessat(AT_FDCWD, path.c_str(), W_OK, AT_EACCESS) != 0)
    throwSystemError(errno, path);
  const fs::path target = linkTarget(path);
  target_ = target;
  folder_ = target.has_parent_path() ? target.parent_path().string() : ".";
  mayReplace_ = options.mayReplace;
  const std::string& model = options.like.empty() ? path : options.like;
  if (!options.like.empty() && ::stat(model.c_str(), &old) != 0) throwSystemError(errno, model);
  const bool hasModel = exists || !options.like.empty();
  const mode_t usual = hasModel ? 0 : usualPermissions(folder_);
  Descriptor file = makeTemporary(target.parent_path(), 0600, temporary_, recorded_);
  writeAll(file, temporary_, bytes.bytes);
  if (bytes.rest != nullptr) {
    forEachBlock(*bytes.rest, [&](std::span<const std::uint8_t> block) {
      if (options.wait.stop.stop_requested()) throw Stopped();
      writeAll(file, temporary_, block);
    });
  }
  // Nobody else has it before it is whole.
  if (hasModel) {
    takeAfter(old, model, file, temporary_);
  } else if (::fchmod(file.get(), usual) != 0) {
    throwSystemError(errno, temporary_);
  }
  if (hasModel && options.keepTimes) takeTimes(old, file, temporary_);
  if (!options.timesOf.empty()) {
    struct stat other = {};
    if (::stat(options.timesOf.c_str(), &other) != 0) throwSystemError(errno, options.timesOf);
    takeTimes(other, file, temporary_);
  }
  sync(file, temporary_);
  lock_ = file.release();
}

Replacement::~Replacement() {
  if (!temporary_.empty()) ::unlink(temporary_.c_str());
  if (lock_ >= 0) ::close(lock_);
}

void Replacement::replace() {
  if (temporary_.empty()) return;
  const char* const from = temporary_.c_str();
  const char* const to = target_.c_str();
  if ((mayReplace_ ? ::rename(from, to) : renameToNew(from, to)) != 0)
    throwSystemError(errno, target_);
  temporary_.clear();
  recorded_.forget();
  ::close(std::exchange(lock_, -1));
  syncFolder(folder_);
}

void writeFileAtomically(const std::string& path, const FileView& bytes,
                         const ReplaceOptions& options) {
  Replacement(path, bytes, options).replace();
}

Descriptor unnamedTemporary(const std::string& folder) {
  return nameless(folder, 0600);
}

int renameToNew(const char* from, const char* to) {
  if (::syscall(SYS_renameat2, AT_FDCWD, from, AT_FDCWD, to, RENAME_NOREPLACE) == 0) return 0;
  if (errno != ENOSYS && errno != EINVAL && errno != ENOTSUP) return -1;
  // File systems without it: a second name is never given over a file.
  if (::link(from, to) == 0) return ::unlink(from);
  if (errno == EEXIST) return -1;
  // And without second names: an empty file keeps the place.
  const int place = ::open(to, O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0600);
  if (place < 0) return -1;
  ::close(place);
  if (::rename(from, to) == 0) return 0;
  const int code = errno;
  ::unlink(to);
  errno = code;
  return -1;
}

// A name that is not on the disk yet means the old file after a power cut, which is whole.
void syncFolder(const std::string& folder) {
  const int descriptor = ::open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
  if (descriptor < 0) return;
  ::fsync(descriptor);
  ::close(descriptor);
}

void sweepLeftovers(const std::string& folder) {
  std::error_code ignored;
  for (fs::directory_iterator entry(folder.empty() ? "." : folder, ignored), end; entry != end;
       entry.increment(ignored)) {
    if (!isTemporaryName(entry->path().filename().native())) continue;
    const int file = ::open(entry->path().c_str(), O_WRONLY | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC);
    if (file < 0) continue;
    struct stat status = {};
    // Once locked it is nobody's; without a name somebody else has removed it.
    const bool isLeft = ::flock(file, LOCK_EX | LOCK_NB) == 0 && ::fstat(file, &status) == 0 &&
                        S_ISREG(status.st_mode) && status.st_nlink != 0;
    if (isLeft) ::unlink(entry->path().c_str());
    ::close(file);
  }
}

}  // namespace pelorin::photo
