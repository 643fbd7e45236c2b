#pragma once

#include <string>

namespace pelorin::imgproc {

/// The path that Java means by these modified UTF-8 bytes: characters beyond the basic plane, which
/// modified UTF-8 spells as two surrogates of three bytes each, become four bytes as in file names.
/// @throws std::invalid_argument when the path holds the character NUL, which no file name may.
std::string utf8Path(const char* modifiedUtf8);

}  // namespace pelorin::imgproc
