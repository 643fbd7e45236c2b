#pragma once

#include <cstdint>

#include "photo/decode_limits.h"

namespace pelorin::photo {

/// Of a file that has more bytes than this. @throws PhotoError (tooLarge).
[[noreturn]] void refuseFileSize(std::uint64_t mostBytes);

/// @param bytes  of the file.
/// @throws PhotoError (tooLarge) when they are more than the limit.
void checkFileSize(std::uint64_t bytes, const DecodeLimits& limits);

}  // namespace pelorin::photo
