#include "cli/frame/base64.h"

#include <cstddef>
#include <string_view>

namespace pelorin::cli {

std::string base64(std::span<const std::uint8_t> bytes) {
  constexpr std::string_view digits =
      "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
  std::string text;
  for (std::size_t i = 0; i < bytes.size(); i += 3) {
    const auto byte = [&](std::size_t at) -> std::uint32_t {
      return at < bytes.size() ? bytes[at] : 0;
    };
    const std::uint32_t bits = byte(i) << 16 | byte(i + 1) << 8 | byte(i + 2);
    text += digits[bits >> 18];
    text += digits[bits >> 12 & 63];
    text += i + 1 < bytes.size() ? digits[bits >> 6 & 63] : '=';
    text += i + 2 < bytes.size() ? digits[bits & 63] : '=';
  }
  return text;
}

}  // namespace pelorin::cli
