#include "platform/pn/log_line.h"

#include <sys/time.h>
#include <time.h>
#include <unistd.h>

#include <algorithm>
#include <cstddef>
#include <cstdio>

namespace {

char letterOf(int priority) {
  constexpr char letters[] = "VDIWEF";  // 2 ... 7
  return priority >= 2 && priority <= 7 ? letters[priority - 2] : '?';
}

}  // namespace

void pn_writeLogLine(int priority, const char* tag, const char* text) {
  timeval now;
  tm local{};
  gettimeofday(&now, nullptr);
  localtime_r(&now.tv_sec, &local);

  char line[1200];
  constexpr std::size_t room = sizeof(line) - 1;  // for the newline
  std::size_t length = strftime(line, room, "%m-%d %H:%M:%S", &local);
  const int added = snprintf(line + length, room - length, ".%03d %c %.100s: %s",
                             static_cast<int>(now.tv_usec / 1000), letterOf(priority), tag, text);
  if (added > 0) length = std::min(length + static_cast<std::size_t>(added), room - 1);
  line[length++] = '\n';
  // There is nobody to tell when standard error is closed.
  [[maybe_unused]] const auto written = write(STDERR_FILENO, line, length);
}
