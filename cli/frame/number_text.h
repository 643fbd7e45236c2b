#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace pelorin::cli {

/// The finite number that `text` is as a whole, with a point whatever the locale.
/// @param what  names the number in the message: "--slider".
/// @throws UsageError for anything else, NaN and infinity included.
float readFiniteNumber(const std::string& what, std::string_view text);

/// A strength in 0 ... 1.
/// @throws UsageError for anything else.
float readSlider(const std::string& what, const std::string& text);

/// A decimal number of digits only, 1 or more.
/// @throws UsageError for anything else and above 2^32 - 1.
std::uint32_t readPositiveInteger(const std::string& what, std::string_view text);

/// The number whose shortest text is `value` to nine significant digits, which tell every float
/// from its neighbours: for JSON.
double nineDigits(float value);

}  // namespace pelorin::cli
