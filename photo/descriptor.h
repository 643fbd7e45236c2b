#pragma once

#include <fcntl.h>
#include <sys/types.h>
#include <unistd.h>

#include <cerrno>
#include <string>
#include <system_error>
#include <utility>

namespace pelorin::photo {

[[noreturn]] inline void throwSystemError(int code, const std::string& path) {
  throw std::system_error(code, std::generic_category(), path);
}

/// An open file, closed with its scope.
class Descriptor {
 public:
  /// @throws std::system_error when it cannot be opened.
  Descriptor(const std::string& path, int flags, mode_t mode = 0) {
    do {
      descriptor_ = ::open(path.c_str(), flags | O_CLOEXEC, mode);
    } while (descriptor_ < 0 && errno == EINTR);
    if (descriptor_ < 0) throwSystemError(errno, path);
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

}  // namespace pelorin::photo
