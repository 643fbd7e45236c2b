#pragma once

#include <cstdint>
#include <span>
#include <vector>

namespace pelorin::photo {

/// An Exif segment that has the texts with these tags of another one's first and Exif directory, and
/// nothing else.
/// @param payload  an APP1 segment after its length. Any bytes are safe.
/// @returns likewise; empty when there is none of them.
std::vector<std::uint8_t> exifExcerpt(std::span<const std::uint8_t> payload,
                                      std::span<const std::uint16_t> tags);

}  // namespace pelorin::photo
