#pragma once

#include <cstdint>
#include <span>

namespace pelorin::photo {

/// Whether the payload of an APP1 segment begins as Exif does.
bool isExif(std::span<const std::uint8_t> payload);

/// The orientation that an Exif segment states, 1 ... 8; 1 when it states none that is valid.
/// @param payload  an APP1 segment after its length; any bytes are safe, and what is no Exif
///                 segment states nothing.
int exifOrientation(std::span<const std::uint8_t> payload);

}  // namespace pelorin::photo
