#pragma once

#include <cstddef>
#include <string>

// Numbers as text and back, correctly rounded, in a tenth of the code that the C library has for it, which
// computes with 128 bits.

namespace wasm {

/// A double has 53 bits, the lowest of them 2^-1074; a float 24 and 2^-149.
struct Precision {
  int bits;
  int lowest;
};
constexpr Precision doublePrecision{53, -1074};
constexpr Precision floatPrecision{24, -149};

/// The number at the start of a text, as strtod (or strtof) of the C locale reads it.
/// @param end  receives where it ends, `text` when there is none; may be null.
double readNumber(const char* text, char** end, Precision precision);

enum class Style { fixed, scientific, general };

/// What printf's %.*f, %.*e and %.*g write; without the end of a string.
/// @param precision  0 ... 400.
std::string writeNumber(double value, Style style, int precision);

}  // namespace wasm
