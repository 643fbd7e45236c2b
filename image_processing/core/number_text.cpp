#include "image_processing/core/number_text.h"

#include <algorithm>
#include <charconv>
#include <string_view>

namespace pelorin::image_processing {
namespace {

// As many digits as a double has, a sign, a point and an exponent; more where zeros fill up.
constexpr std::size_t longest = 40;

}  // namespace

std::string shortestText(double value) {
  char text[longest];
  const std::to_chars_result end =
      std::to_chars(text, text + longest, value, std::chars_format::scientific);
  const std::string_view written(text, static_cast<std::size_t>(end.ptr - text));
  const std::size_t mark = written.find('e');
  if (mark == written.npos) return std::string(written);

  int exponent = 0;
  std::from_chars(text + mark + (written[mark + 1] == '+' ? 2 : 1), end.ptr, exponent);
  if (exponent < -4 || exponent >= 16) return std::string(written);
  const auto isDigit = [](char letter) { return letter >= '0' && letter <= '9'; };
  const auto digits = static_cast<int>(std::count_if(text, text + mark, isDigit));
  const int decimals = std::max(0, digits - 1 - exponent);
  return {text, std::to_chars(text, text + longest, value, std::chars_format::fixed, decimals).ptr};
}

std::string roundedText(double value, int digits) {
  char text[longest];
  return {text, std::to_chars(text, text + longest, value, std::chars_format::general, digits).ptr};
}

std::string paddedText(int value, std::size_t length) {
  std::string text = std::to_string(value);
  return text.insert(value < 0 ? 1 : 0, length - std::min(length, text.size()), '0');
}

}  // namespace pelorin::image_processing
