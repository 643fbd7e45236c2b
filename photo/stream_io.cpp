#include "photo/stream_io.h"

#include <poll.h>
#include <sys/stat.h>

#include <thread>

#include "photo/descriptor.h"
#include "photo/file_size.h"
#include "photo/photo_error.h"

namespace pelorin::photo {
namespace {

constexpr std::chrono::milliseconds turn{50};

// What became of `descriptor` within one turn.
short happened(int descriptor, short events) {
  pollfd waiting = {descriptor, events, 0};
  return ::poll(&waiting, 1, static_cast<int>(turn.count())) > 0 ? waiting.revents : short{0};
}

[[noreturn]] void giveUp(const char* what) {
  throw PhotoError(PhotoError::Kind::empty, what);
}

void stopIfAsked(const Waiting& wait) {
  if (wait.stop.stop_requested()) throw Stopped();
}

bool isBusy(int code) {
  return code == EINTR || code == EAGAIN;
}

Descriptor openForWriting(const std::string& path, const Waiting& wait) {
  for (std::chrono::milliseconds waited{0};; waited += turn) {
    stopIfAsked(wait);
    try {
      return Descriptor(path, O_WRONLY | O_TRUNC | O_NONBLOCK);
    } catch (const std::system_error& error) {
      struct stat status = {};
      const bool isPipe = ::stat(path.c_str(), &status) == 0 && S_ISFIFO(status.st_mode);
      if (error.code().value() != ENXIO || !isPipe) throw;
    }
    if (waited >= wait.patience) giveUp("nobody reads from this pipe");
    std::this_thread::sleep_for(turn);
  }
}

}  // namespace

std::vector<std::uint8_t> readToEnd(int descriptor, const std::string& path,
                                    const ReadOptions& options) {
  const bool blocks = (::fcntl(descriptor, F_GETFL) & O_NONBLOCK) == 0;
  std::vector<std::uint8_t> bytes(65536);
  std::size_t used = 0;
  std::chrono::milliseconds waited{0};
  for (;;) {
    stopIfAsked(options.wait);
    const short events = happened(descriptor, POLLIN);
    if (events == 0 && blocks) continue;
    if (used == bytes.size()) bytes.resize(used * 2);
    const ssize_t count = ::read(descriptor, bytes.data() + used, bytes.size() - used);
    if (count < 0 && !isBusy(errno)) throwSystemError(errno, path);
    if (count > 0) used += static_cast<std::size_t>(count);
    if (used > options.largest) refuseFileSize(options.largest);
    if (count != 0) continue;
    // Nothing to read and nothing to wait for: the end, or that nobody has begun to write.
    if (events != 0 || used > 0) break;
    waited += turn;
    if (waited >= options.wait.patience) giveUp("nobody writes to this pipe");
  }
  bytes.resize(used);
  return bytes;
}

void writeStream(const std::string& path, std::span<const std::uint8_t> bytes,
                 const Waiting& wait) {
  Descriptor file = openForWriting(path, wait);
  while (!bytes.empty()) {
    stopIfAsked(wait);
    const ssize_t count = ::write(file.get(), bytes.data(), bytes.size());
    if (count >= 0) {
      bytes = bytes.subspan(static_cast<std::size_t>(count));
    } else if (!isBusy(errno)) {
      throwSystemError(errno, path);
    } else {
      happened(file.get(), POLLOUT);
    }
  }
  // A full disk may show only on closing.
  if (::close(file.release()) != 0 && errno != EINTR) throwSystemError(errno, path);
}

}  // namespace pelorin::photo
