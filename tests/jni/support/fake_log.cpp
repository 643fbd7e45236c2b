#include "tests/jni/support/fake_log.h"

#include <cstdarg>
#include <cstdio>
#include <mutex>

#include "platform/pn/log.h"

namespace pelorin::test_support {
namespace {

// Lines are kept without an allocation, since allocations are made to fail. What does not fit is
// dropped.
char buffer[1 << 16];
std::size_t used = 0;
std::mutex mutex;

}  // namespace

std::vector<std::string> takeLogLines() {
  const std::lock_guard lock(mutex);
  std::vector<std::string> lines;
  for (std::size_t start = 0; start < used; start += lines.back().size() + 1)
    lines.emplace_back(buffer + start);
  used = 0;
  return lines;
}

}  // namespace pelorin::test_support

void pn_printLog(int priority, const char* tag, const char* format, ...) {
  using namespace pelorin::test_support;
  char line[512];
  int length = snprintf(line, sizeof(line), "%d %s: ", priority, tag);
  va_list arguments;
  va_start(arguments, format);
  length += vsnprintf(line + length, sizeof(line) - length, format, arguments);
  va_end(arguments);
  if (length >= static_cast<int>(sizeof(line))) length = sizeof(line) - 1;
  const std::lock_guard lock(mutex);
  if (used + length + 1 > sizeof(buffer)) return;
  for (int i = 0; i < length; ++i) buffer[used++] = line[i];
  buffer[used++] = '\0';
}
