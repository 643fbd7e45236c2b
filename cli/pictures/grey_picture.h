#pragma once

#include "image_processing/core/image.h"

namespace pelorin::cli {

/// A plane of values in [0, 1] as a grey picture: 0 black, 1 white, rounded to nearest. Values
/// outside take the nearer end, NaN is black; alpha is 255.
/// @throws std::bad_alloc when the picture does not fit into memory.
image_processing::Image<image_processing::RGBA8Pixel> greyPicture(
    const image_processing::Image<float>& plane);

}  // namespace pelorin::cli
