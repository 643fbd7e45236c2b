#include "photo/file_io.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <filesystem>
#include <optional>
#include <string>
#include <system_error>
#include <utility>

namespace fs = std::filesystem;

namespace pelorin::imgproc {
namespace {

constexpr std::uint64_t largestFile = std::uint64_t{1} << 31;

[[noreturn]] void throwError(int code, const std::string& path) {
  throw std::system_error(code, std::generic_category(), path);
}

// Gone with its scope.
class Descriptor {
 public:
  Descriptor(const std::string& path, int flags, mode_t mode = 0)
      : descriptor_(::open(path.c_str(), flags | O_CLOEXEC, mode)) {
    if (descriptor_ < 0) throwError(errno, path);
  }
  ~Descriptor() {
    if (descriptor_ >= 0) ::close(descriptor_);
  }
  Descriptor(const Descriptor&) = delete;
  Descriptor& operator=(const Descriptor&) = delete;

  int get() const { return descriptor_; }
  int release() { return std::exchange(descriptor_, -1); }

 private:
  int descriptor_;
};

void writeAll(Descriptor& file, const std::string& path, std::span<const std::uint8_t> bytes) {
  while (!bytes.empty()) {
    const ssize_t count = ::write(file.get(), bytes.data(), bytes.size());
    if (count >= 0) {
      bytes = bytes.subspan(static_cast<std::size_t>(count));
    } else if (errno != EINTR) {
      throwError(errno, path);
    }
  }
  // A full disk may show only on closing.
  if (::close(file.release()) != 0 && errno != EINTR) throwError(errno, path);
}

// The file that `path` names after following symbolic links, which need not exist.
fs::path linkTarget(fs::path path) {
  constexpr int mostLinks = 40;
  std::error_code ignored;
  for (int links = 0; fs::is_symlink(fs::symlink_status(path, ignored)); ++links) {
    if (links == mostLinks) throwError(ELOOP, path);
    path = path.parent_path() / fs::read_symlink(path);
  }
  return path;
}

// A new empty file in the folder of `target`, removed with this unless it has replaced it.
class Replacement {
 public:
  Replacement(const fs::path& target, mode_t mode) : path_(nextName(target)) {
    for (;;) {
      try {
        file_.emplace(path_, O_WRONLY | O_CREAT | O_EXCL, mode);
        return;
      } catch (const std::system_error& error) {
        if (error.code() != std::errc::file_exists) throw;
        path_ = nextName(target);
      }
    }
  }
  ~Replacement() {
    if (!path_.empty()) ::unlink(path_.c_str());
  }
  Replacement(const Replacement&) = delete;
  Replacement& operator=(const Replacement&) = delete;

  // Owner and permissions as those of the file to replace; the owner as far as we may.
  void takeAfter(const struct stat& old) {
    const bool keepsOwner = ::fchown(file_->get(), old.st_uid, old.st_gid) == 0;
    const mode_t permissions = old.st_mode & (keepsOwner ? 07777 : 0777);
    if (::fchmod(file_->get(), permissions) != 0) throwError(errno, path_);
  }

  void write(std::span<const std::uint8_t> bytes) { writeAll(*file_, path_, bytes); }

  void replace(const fs::path& target) {
    if (::rename(path_.c_str(), target.c_str()) != 0) throwError(errno, target);
    path_.clear();
  }

 private:
  static std::string nextName(const fs::path& target) {
    static std::atomic<unsigned> counter = 0;
    return target.parent_path() /
           (".quenby-" + std::to_string(::getpid()) + "-" + std::to_string(counter++) + ".tmp");
  }

  std::string path_;
  std::optional<Descriptor> file_;
};

}  // namespace

std::vector<std::uint8_t> readFile(const std::string& path) {
  const Descriptor file(path, O_RDONLY);
  struct stat status = {};
  if (::fstat(file.get(), &status) != 0) throwError(errno, path);
  constexpr std::size_t block = 65536;
  const bool isRegular = S_ISREG(status.st_mode);
  if (isRegular && std::uint64_t(status.st_size) > largestFile) throwError(EFBIG, path);
  // One byte more than there is, so that the end shows without growing.
  std::vector<std::uint8_t> bytes(isRegular ? std::size_t(status.st_size) + 1 : block);
  std::size_t used = 0;
  for (;;) {
    if (used == bytes.size()) bytes.resize(used * 2);
    const ssize_t count = ::read(file.get(), bytes.data() + used, bytes.size() - used);
    if (count < 0 && errno != EINTR) throwError(errno, path);
    if (count == 0) break;
    if (count > 0) used += static_cast<std::size_t>(count);
    if (used > largestFile) throwError(EFBIG, path);
  }
  bytes.resize(used);
  return bytes;
}

void writeFileAtomically(const std::string& path, std::span<const std::uint8_t> bytes) {
  struct stat old = {};
  const bool exists = ::stat(path.c_str(), &old) == 0;
  if (exists && !S_ISREG(old.st_mode)) {
    // Renaming over a device would put an ordinary file in its place.
    Descriptor file(path, O_WRONLY);
    return writeAll(file, path, bytes);
  }
  // The rename needs only the folder; a protected file stays protected all the same.
  if (exists && ::faccessat(AT_FDCWD, path.c_str(), W_OK, AT_EACCESS) != 0) throwError(errno, path);
  const fs::path target = linkTarget(path);
  Replacement replacement(target, exists ? 0600 : 0666);
  if (exists) replacement.takeAfter(old);
  replacement.write(bytes);
  replacement.replace(target);
}

}  // namespace pelorin::imgproc
