#include "platform/pn/log_line.h"

// As in the platform's own header.
extern "C" int __android_log_write(int priority, const char* tag, const char* text);

void pn_writeLogLine(int priority, const char* tag, const char* text) {
  __android_log_write(priority, tag, text);
}
