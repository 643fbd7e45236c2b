#include "cli/frame/shown_text.h"

#include <fmt/format.h>

#include <cstdint>

namespace pelorin::cli {
namespace {

std::uint32_t codePointOf(std::string_view character) {
  std::uint32_t codePoint = static_cast<std::uint8_t>(character[0]);
  if (character.size() > 1) codePoint &= 0xFFu >> (character.size() + 1);
  for (const char byte : character.substr(1)) {
    codePoint = codePoint << 6 | (static_cast<std::uint8_t>(byte) & 0x3Fu);
  }
  return codePoint;
}

// Controls, separators of lines and paragraphs, marks that turn the direction of writing.
bool isHarmful(std::uint32_t c) {
  return c < 0x20 || (c >= 0x7F && c < 0xA0) || c == 0x200E || c == 0x200F ||
         (c >= 0x2028 && c <= 0x202E) || (c >= 0x2066 && c <= 0x2069);
}

}  // namespace

std::size_t characterLength(std::string_view text) {
  const auto byte = [&](std::size_t i) { return static_cast<std::uint8_t>(text[i]); };
  const std::uint8_t first = byte(0);
  if (first < 0x80) return 1;
  const std::size_t length = first >= 0xF0 ? 4 : first >= 0xE0 ? 3 : 2;
  if (first < 0xC2 || first > 0xF4 || text.size() < length) return 0;
  for (std::size_t i = 1; i < length; ++i) {
    if ((byte(i) & 0xC0) != 0x80) return 0;
  }
  const std::uint32_t codePoint = codePointOf(text.substr(0, length));
  const std::uint32_t least = length == 2 ? 0x80 : length == 3 ? 0x800 : 0x10000;
  const bool surrogate = codePoint >= 0xD800 && codePoint <= 0xDFFF;
  return codePoint < least || codePoint > 0x10FFFF || surrogate ? 0 : length;
}

bool isUtf8(std::string_view text) {
  while (!text.empty()) {
    const std::size_t length = characterLength(text);
    if (length == 0) return false;
    text.remove_prefix(length);
  }
  return true;
}

std::string shownText(std::string_view text) {
  std::string shown;
  while (!text.empty()) {
    const std::size_t length = characterLength(text);
    const std::string_view character = text.substr(0, length == 0 ? 1 : length);
    text.remove_prefix(character.size());
    if (length != 0 && !isHarmful(codePointOf(character))) {
      shown += character;
    } else if (character == "\n") {
      shown += "\\n";
    } else if (character == "\r") {
      shown += "\\r";
    } else if (character == "\t") {
      shown += "\\t";
    } else {
      for (const char byte : character) {
        shown += fmt::format("\\x{:02x}", static_cast<std::uint8_t>(byte));
      }
    }
  }
  return shown;
}

std::string shownName(const std::string& path) {
  return path == "-" ? "standard input" : shownText(path);
}

}  // namespace pelorin::cli
