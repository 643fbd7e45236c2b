#include "cli/frame/base64.h"

#include <cstddef>
#include <string_view>

namespace pelorin::cli {
namespace {

constexpr std::string_view digits =
    "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";

}  // namespace

std::string base64(std::span<const std::uint8_t> bytes) {
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

std::optional<std::string> fromBase64(std::string_view text) {
  if (text.size() % 4 != 0) return std::nullopt;
  const std::size_t padding = text.ends_with("==") ? 2 : text.ends_with("=") ? 1 : 0;
  std::string bytes;
  std::uint32_t bits = 0;
  for (std::size_t i = 0; i < text.size(); ++i) {
    const bool isPadding = i >= text.size() - padding;
    const std::size_t digit = isPadding ? 0 : digits.find(text[i]);
    if (digit == std::string_view::npos) return std::nullopt;
    bits = bits << 6 | static_cast<std::uint32_t>(digit);
    if (i % 4 != 3) continue;
    for (const int shift : {16, 8, 0}) bytes += static_cast<char>(bits >> shift & 255);
    bits = 0;
  }
  bytes.resize(bytes.size() - padding);
  return bytes;
}

}  // namespace pelorin::cli
