#pragma once

#include <cstddef>

#include "image_processing/core/pixel_types.h"

namespace pelorin::image_processing {

/// Share of each channel in the grey that the quality score looks at; they sum to 1.
constexpr float niqeRed = 0.3f, niqeGreen = 0.6f, niqeBlue = 0.1f;

/// Grey of each pixel: (green part + red part) + blue part, in float.
/// @param pixels  `count` pixels in any alignment; alpha is ignored.
/// @param grey    `count` floats, written, 0 ... 255 and not rounded; must not overlap `pixels`.
/// Never throws and keeps no state, so any thread may call it.
void niqeGrey(const RGBA8Pixel* pixels, float* grey, std::size_t count);

/// The definition of `niqeGrey`, one pixel at a time.
void niqeGreyScalar(const RGBA8Pixel* pixels, float* grey, std::size_t count);

}  // namespace pelorin::image_processing
