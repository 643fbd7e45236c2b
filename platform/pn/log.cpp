#include "platform/pn/log.h"

#include <atomic>
#include <cstdarg>
#include <cstddef>
#include <cstdio>

#include "platform/pn/log_line.h"

namespace {

std::atomic<int> leastPriority = 4;

constexpr std::size_t longestText = 1100;

/// Names of files may hold anything. Control characters become "\x0a" and the like, so that a line
/// stays one line and says nothing to a terminal.
void quoteControls(const char* text, char (&quoted)[longestText]) {
  constexpr std::size_t longestEscape = 6;
  std::size_t length = 0;
  for (; *text != '\0' && length + longestEscape < longestText; ++text) {
    const auto byte = static_cast<unsigned char>(text[0]);
    const auto next = static_cast<unsigned char>(text[1]);
    if (byte == 0xC2 && next >= 0x80 && next < 0xA0) {  // those of Unicode, in UTF-8
      length += static_cast<std::size_t>(snprintf(quoted + length, 7, "\\u%04x", unsigned{next}));
      ++text;
    } else if (byte < 0x20 || byte == 0x7F) {
      length += static_cast<std::size_t>(snprintf(quoted + length, 5, "\\x%02x", unsigned{byte}));
    } else {
      quoted[length++] = *text;
    }
  }
  quoted[length] = '\0';
}

}  // namespace

void pn_setLogPriority(int priority) {
  leastPriority = priority;
}

void pn_printLog(int priority, const char* tag, const char* format, ...) {
  if (priority < leastPriority) return;
  char text[longestText];
  va_list arguments;
  va_start(arguments, format);
  const int length = vsnprintf(text, sizeof(text), format, arguments);
  va_end(arguments);
  if (length < 0) return;
  char quoted[longestText];
  quoteControls(text, quoted);
  pn_writeLogLine(priority, tag, quoted);
}
