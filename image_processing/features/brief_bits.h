#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

namespace pelorin::image_processing {

/// Steps in bytes from a corner to the pixels of the pattern, in an image of one width: the 256
/// first pixels of each pair, then the second ones.
using BriefOffsets = std::array<std::ptrdiff_t, 512>;

/// The offsets for rows of `width` pixels.
BriefOffsets briefOffsets(std::uint32_t width);

/// The 256 comparisons around one pixel, which must lie 15 or more pixels from every border.
/// Bit i is bit i mod 32 of word i / 32. Never throws and keeps no state.
std::array<std::uint32_t, 8> briefBits(const std::uint8_t* center, const BriefOffsets& offsets);

/// The definition of `briefBits`, straight from the pattern.
std::array<std::uint32_t, 8> briefBitsScalar(const std::uint8_t* center, std::uint32_t width);

}  // namespace pelorin::image_processing
