#include "platform/pn/log.h"

#include <atomic>
#include <cstdarg>
#include <cstdio>

#include "platform/pn/log_line.h"

namespace {

std::atomic<int> leastPriority = 4;

}  // namespace

void pn_setLogPriority(int priority) {
  leastPriority = priority;
}

void pn_printLog(int priority, const char* tag, const char* format, ...) {
  if (priority < leastPriority) return;
  char text[1100];
  va_list arguments;
  va_start(arguments, format);
  const int length = vsnprintf(text, sizeof(text), format, arguments);
  va_end(arguments);
  if (length >= 0) pn_writeLogLine(priority, tag, text);
}
