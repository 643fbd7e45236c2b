#include "platform/pnjni/java_message.h"

namespace pelorin::jni {
namespace {

bool continues(char byte) {
  return (static_cast<unsigned char>(byte) & 0xC0) == 0x80;
}

/// Bytes of the character at `text`, 0 when it is none of modified UTF-8.
int characterLength(const char* text) {
  const auto first = static_cast<unsigned char>(text[0]);
  if (first < 0x80) return 1;
  if (first >= 0xC2 && first < 0xE0) return continues(text[1]) ? 2 : 0;
  if (first >= 0xE0 && first < 0xF0) return continues(text[1]) && continues(text[2]) ? 3 : 0;
  return 0;
}

}  // namespace

JavaMessage::JavaMessage(const char* text) noexcept {
  char* out = buffer_;
  while (*text != '\0' && out < buffer_ + 1000) {
    const int length = characterLength(text);
    if (length == 0) {
      *out++ = '?';
      do ++text;
      while (continues(*text));
    }
    for (int i = 0; i < length; ++i) *out++ = *text++;
  }
  *out = '\0';
}

}  // namespace pelorin::jni
