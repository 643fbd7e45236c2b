#pragma once

#include <cstddef>

#include "image_processing/core/pixel_types.h"

namespace pelorin::image_processing {

/// How much each pixel's colour is that of skin: 0 is not at all, 1 fully.
/// @param pixels  `count` of them; alpha is ignored.
/// @param skin    `count` floats, written.
/// Never throws and keeps no state.
void findSkin(const RGBA8Pixel* pixels, float* skin, std::size_t count);

/// The definition of `findSkin`.
void findSkinScalar(const RGBA8Pixel* pixels, float* skin, std::size_t count);

}  // namespace pelorin::image_processing
