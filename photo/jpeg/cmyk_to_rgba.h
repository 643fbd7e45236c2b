#pragma once

#include <cstdint>
#include <span>

namespace pelorin::photo {

/// Turns CMYK pixels into RGBA in place, alpha 255.
/// @param pixels    `width` x `height` x 4 bytes, rows back to back.
/// @param inverted  whether 255 is no ink (as Adobe writes files) or full ink.
/// @param profile   an ICC profile for the inks, to sRGB with perceptual intent. Empty, or one that
///                  does not read or is not for CMYK: light = (1 - ink) (1 - black).
/// @throws std::bad_alloc when the colour transform does not fit.
void cmykToRgba(std::uint8_t* pixels, std::uint32_t width, std::uint32_t height, bool inverted,
                std::span<const std::uint8_t> profile);

}  // namespace pelorin::photo
