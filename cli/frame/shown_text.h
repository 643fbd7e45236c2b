#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace pelorin::cli {

/// Bytes of the character at the start of `text`, which is not empty; 0 when it is not UTF-8.
std::size_t characterLength(std::string_view text);

/// Whether all of `text` is UTF-8.
bool isUtf8(std::string_view text);

/// `text` as one line of UTF-8 that does nothing to a terminal: what would move its cursor, turn the
/// direction of writing or is no UTF-8 is spelt out, as "\n" or "\x1b". File names may hold anything.
std::string shownText(std::string_view text);

/// What messages call an input; safe to print.
std::string shownName(const std::string& path);

}  // namespace pelorin::cli
