#include "photo/file_io.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <filesystem>
#include <string>
#include <system_error>
#include <utility>

namespace fs = std::filesystem;

namespace pelorin::photo {
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
  Descriptor(Descriptor&& other) noexcept : descriptor_(other.release()) {}
  Descriptor& operator=(Descriptor&&) = delete;

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

// Owner and permissions as those of the file to replace; the owner as far as we may.
void takeAfter(const struct stat& old, const Descriptor& file, const std::string& path) {
  const bool keepsOwner = ::fchown(file.get(), old.st_uid, old.st_gid) == 0;
  const mode_t permissions = old.st_mode & (keepsOwner ? 07777 : 0777);
  if (::fchmod(file.get(), permissions) != 0) throwError(errno, path);
}

// A new empty file in `folder`, whose path `path` gets.
Descriptor makeTemporary(const fs::path& folder, mode_t mode, std::string& path) {
  static std::atomic<unsigned> counter = 0;
  for (;;) {
    std::string name = folder / (".quenby-" + std::to_string(::getpid()) + "-" +
                                 std::to_string(counter++) + ".tmp");
    try {
      Descriptor file(name, O_WRONLY | O_CREAT | O_EXCL, mode);
      path = std::move(name);
      return file;
    } catch (const std::system_error& error) {
      if (error.code() != std::errc::file_exists) throw;
    }
  }
}

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

// Delegates, so that the destructor also runs when this throws.
Replacement::Replacement(const std::string& path, std::span<const std::uint8_t> bytes)
    : Replacement() {
  struct stat old = {};
  const bool exists = ::stat(path.c_str(), &old) == 0;
  if (exists && (!S_ISREG(old.st_mode) || old.st_nlink == 0)) {
    // Renaming over a device would put an ordinary file in its place; a file without a name, reached
    // through its descriptor, has none to take over.
    Descriptor file(path, O_WRONLY | O_TRUNC);
    writeAll(file, path, bytes);
    return;
  }
  // The rename needs only the folder; a protected file stays protected all the same.
  if (exists && ::faccessat(AT_FDCWD, path.c_str(), W_OK, AT_EACCESS) != 0) throwError(errno, path);
  const fs::path target = linkTarget(path);
  target_ = target;
  Descriptor file = makeTemporary(target.parent_path(), exists ? 0600 : 0666, temporary_);
  if (exists) takeAfter(old, file, temporary_);
  writeAll(file, temporary_, bytes);
}

Replacement::~Replacement() {
  if (!temporary_.empty()) ::unlink(temporary_.c_str());
}

void Replacement::replace() {
  if (temporary_.empty()) return;
  if (::rename(temporary_.c_str(), target_.c_str()) != 0) throwError(errno, target_);
  temporary_.clear();
}

void writeFileAtomically(const std::string& path, std::span<const std::uint8_t> bytes) {
  Replacement(path, bytes).replace();
}

}  // namespace pelorin::photo
