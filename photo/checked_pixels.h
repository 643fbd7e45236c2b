#pragma once

#include <cstddef>
#include <cstdint>

#include "photo/decode_limits.h"
#include "photo/picture_size.h"

namespace pelorin::photo {

// What every format asks before it takes memory for a picture. @throws PhotoError (tooLarge).

/// @returns how many pixels there are, which is no more than the limit.
std::uint64_t checkPixels(PictureSize size, const DecodeLimits& limits);

/// For files in which a few bytes may stand for any number of pixels.
void checkCompressedPixels(PictureSize size, std::size_t bytes, const DecodeLimits& limits);

}  // namespace pelorin::photo
