#include "cli/verbs/watch/folder_events.h"

#include <poll.h>
#include <sys/inotify.h>
#include <unistd.h>

#include <array>
#include <cstdint>

namespace pelorin::cli {

FolderEvents::FolderEvents() : queue_(inotify_init1(IN_NONBLOCK | IN_CLOEXEC)) {}

FolderEvents::~FolderEvents() {
  if (queue_ >= 0) close(queue_);
}

bool FolderEvents::listenTo(const std::string& folder) {
  constexpr std::uint32_t changes =
      IN_CLOSE_WRITE | IN_MODIFY | IN_MOVED_TO | IN_CREATE | IN_ATTRIB;
  return queue_ >= 0 && inotify_add_watch(queue_, folder.c_str(), changes | IN_ONLYDIR) >= 0;
}

bool FolderEvents::wait(int milliseconds) {
  pollfd waiting = {queue_, POLLIN, 0};  // a negative descriptor waits for the time alone
  if (poll(&waiting, 1, milliseconds) <= 0) return false;
  std::array<char, 65536> events;
  while (read(queue_, events.data(), events.size()) > 0) {
  }
  return true;
}

}  // namespace pelorin::cli
