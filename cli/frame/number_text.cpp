#include "cli/frame/number_text.h"

#include <fmt/format.h>

#include <charconv>
#include <cmath>
#include <cstdlib>

#include "cli/frame/errors.h"

namespace pelorin::cli {

float readFiniteNumber(const std::string& what, std::string_view text) {
  float number = 0.0f;
  const char* end = text.data() + text.size();
  const std::from_chars_result result = std::from_chars(text.data(), end, number);
  if (result.ec != std::errc() || result.ptr != end || !std::isfinite(number)) {
    throw UsageError(what + ": '" + std::string(text) + "' is not a number");
  }
  return number;
}

float readSlider(const std::string& what, const std::string& text) {
  const float slider = readFiniteNumber(what, text);
  if (slider < 0.0f || slider > 1.0f) {
    throw UsageError(what + ": " + text + " is not between 0 and 1");
  }
  return slider;
}

std::uint32_t readPositiveInteger(const std::string& what, std::string_view text) {
  std::uint32_t number = 0;
  const char* end = text.data() + text.size();
  const std::from_chars_result result = std::from_chars(text.data(), end, number);
  if (result.ec != std::errc() || result.ptr != end || number == 0) {
    throw UsageError(what + ": '" + std::string(text) + "' is not a whole number above 0");
  }
  return number;
}

double nineDigits(float value) {
  return std::strtod(fmt::format("{:.9g}", value).c_str(), nullptr);
}

}  // namespace pelorin::cli
