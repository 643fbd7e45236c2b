#pragma once

#include "image_processing/autoenhance/grid.h"
#include "image_processing/core/image.h"

namespace pelorin::image_processing {

/// Adds every pixel to its nearest node: its lightness to the value, 1 to the weight. A node adds
/// up its pixels in raster order.
/// @param cellSize  pixels, at least 1.
/// May throw std::bad_alloc.
void splat(const Image<float>& lightness, float cellSize, Grid& grid);

/// The definition of `splat`.
void splatScalar(const Image<float>& lightness, float cellSize, Grid& grid);

}  // namespace pelorin::image_processing
