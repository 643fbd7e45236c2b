#include "photo/long_file.h"

#include <sys/stat.h>

#include <functional>

#include "photo/photo_error.h"

namespace pelorin::photo {
namespace {

constexpr std::uint64_t longest = std::uint64_t{8} << 20;  // that is read as a whole
constexpr std::size_t firstPart = std::size_t{1} << 20;

[[noreturn]] void refuseChange() {
  throw PhotoError(PhotoError::Kind::damaged, "changed while it was read");
}

struct stat statusOf(const Descriptor& file, const std::string& path) {
  struct stat status = {};
  if (::fstat(file.get(), &status) != 0) throwSystemError(errno, path);
  return status;
}

/// @returns false where the file ends before.
bool readAt(const Descriptor& file, const std::string& path, std::uint64_t place,
            std::span<std::uint8_t> bytes) {
  while (!bytes.empty()) {
    const ssize_t count =
        ::pread(file.get(), bytes.data(), bytes.size(), static_cast<off_t>(place));
    if (count < 0 && errno != EINTR) throwSystemError(errno, path);
    if (count == 0) return false;
    if (count < 0) continue;
    bytes = bytes.subspan(static_cast<std::size_t>(count));
    place += static_cast<std::uint64_t>(count);
  }
  return true;
}

}  // namespace

LongFile::LongFile(Descriptor file, std::string path, std::uint64_t begin, std::stop_token stop)
    : file_(std::move(file)), path_(std::move(path)), begin_(begin), stop_(std::move(stop)) {
  const struct stat status = statusOf(file_, path_);
  size_ = static_cast<std::uint64_t>(status.st_size) - begin;
  changed_ = status.st_mtim;
}

void LongFile::checkUnchanged() const {
  const struct stat status = statusOf(file_, path_);
  if (static_cast<std::uint64_t>(status.st_size) != begin_ + size_ ||
      status.st_mtim.tv_sec != changed_.tv_sec || status.st_mtim.tv_nsec != changed_.tv_nsec)
    refuseChange();
}

void LongFile::read(std::uint64_t place, std::span<std::uint8_t> bytes) {
  if (stop_.stop_requested()) throw Stopped();
  if (!readAt(file_, path_, begin_ + place, bytes)) refuseChange();
  // The clock of a file system is coarse: two changes within one tick show in the bytes alone.
  const std::size_t sum =
      std::hash<std::string_view>()({reinterpret_cast<const char*>(bytes.data()), bytes.size()});
  const auto [known, isNew] = sums_.try_emplace({place, bytes.size()}, sum);
  if (!isNew && known->second != sum) refuseChange();
  if (place + bytes.size() == size_) checkUnchanged();
}

void TemporaryStore::read(std::uint64_t place, std::span<std::uint8_t> bytes) {
  if (!readAt(*file_, folder_, place, bytes)) throwSystemError(EIO, folder_);
}

void TemporaryStore::append(std::span<const std::uint8_t> bytes) {
  if (file_ == nullptr) file_ = std::make_unique<Descriptor>(unnamedTemporary(folder_));
  while (!bytes.empty()) {
    const ssize_t count =
        ::pwrite(file_->get(), bytes.data(), bytes.size(), static_cast<off_t>(size_));
    if (count < 0 && errno != EINTR) throwSystemError(errno, folder_);
    if (count < 0) continue;
    bytes = bytes.subspan(static_cast<std::size_t>(count));
    size_ += static_cast<std::uint64_t>(count);
  }
}

OpenedFile openFile(const std::string& path, const ReadOptions& options,
                    bool (*mayBePart)(std::span<const std::uint8_t> first)) {
  Descriptor file(path, O_RDONLY | O_NONBLOCK);
  const struct stat status = statusOf(file, path);
  const auto size = static_cast<std::uint64_t>(status.st_size);
  if (S_ISREG(status.st_mode) && size > longest && size <= options.largest) {
    std::vector<std::uint8_t> first(firstPart);
    if (readAt(file, path, 0, first) && mayBePart(first)) {
      auto rest =
          std::make_unique<LongFile>(std::move(file), path, first.size(), options.wait.stop);
      return {std::move(first), std::move(rest)};
    }
  }
  return {readDescriptor(file.get(), path, options)};
}

}  // namespace pelorin::photo
