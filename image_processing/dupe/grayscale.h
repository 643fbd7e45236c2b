#pragma once

#include "image_processing/core/export.h"
#include "image_processing/core/image.h"

namespace pelorin::image_processing {

/// The green channel of `image` as a grey picture of its own, not a weighted lightness.
/// @throws std::bad_alloc when it does not fit.
PELORIN_EXPORT Image<unsigned char> imageMakeGrayscale(const Image<RGBA8Pixel>& image);

}  // namespace pelorin::image_processing
