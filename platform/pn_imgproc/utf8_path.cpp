#include "platform/pn_imgproc/utf8_path.h"

#include <cstddef>
#include <stdexcept>
#include <string_view>

namespace pelorin::imgproc {
namespace {

unsigned byteAt(std::string_view text, std::size_t i) {
  return i < text.size() ? static_cast<unsigned char>(text[i]) : 0;
}

/// The surrogate at `i` less its range's start, when its second byte is of that range ("high" 0xA0,
/// "low" 0xB0); -1 otherwise.
int surrogateAt(std::string_view text, std::size_t i, unsigned range) {
  if (byteAt(text, i) != 0xED || (byteAt(text, i + 1) & 0xF0) != range) return -1;
  if ((byteAt(text, i + 2) & 0xC0) != 0x80) return -1;
  return static_cast<int>((byteAt(text, i + 1) & 0x0F) << 6 | (byteAt(text, i + 2) & 0x3F));
}

}  // namespace

std::string utf8Path(const char* modifiedUtf8) {
  const std::string_view text = modifiedUtf8;
  std::string path;
  path.reserve(text.size());
  for (std::size_t i = 0; i < text.size();) {
    if (byteAt(text, i) == 0xC0 && byteAt(text, i + 1) == 0x80)
      throw std::invalid_argument("the path holds a NUL character");
    const int high = surrogateAt(text, i, 0xA0);
    const int low = high < 0 ? -1 : surrogateAt(text, i + 3, 0xB0);
    if (low < 0) {
      path += text[i++];
      continue;
    }
    const unsigned character = 0x10000u + (static_cast<unsigned>(high) << 10) + low;
    path += static_cast<char>(0xF0 | character >> 18);
    path += static_cast<char>(0x80 | (character >> 12 & 0x3F));
    path += static_cast<char>(0x80 | (character >> 6 & 0x3F));
    path += static_cast<char>(0x80 | (character & 0x3F));
    i += 6;
  }
  return path;
}

}  // namespace pelorin::imgproc
