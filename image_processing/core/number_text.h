#pragma once

#include <cstddef>
#include <string>

namespace pelorin::image_processing {

// Numbers as text, with a point whatever the locales are. All are stateless, so any thread may use them;
// only std::bad_alloc is thrown.

/// The shortest text that reads as `value` again: 0.4, 100000, 1e-05. With an exponent of two digits or more
/// below 0.0001 and from 1e+16 on; "inf", "-inf" and "nan" for what is no number.
std::string shortestText(double value);

/// `value` rounded to so many significant digits, as printf's %g writes it, without zeros at its end.
std::string roundedText(double value, int digits);

/// `value` with zeros before its digits, so that it is so long at least, with its sign.
std::string paddedText(int value, std::size_t length);

}  // namespace pelorin::image_processing
