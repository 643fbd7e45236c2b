#pragma once

#include "image_processing/autoenhance/grid.h"
#include "image_processing/core/image.h"

namespace pelorin::image_processing {

/// Reads the grid back at every pixel: values and weights interpolated along y, then x, then
/// lightness, and divided; where the weight is 0 the value stands alone.
/// @param smoothed  written; of the size of `lightness`.
/// May throw std::bad_alloc. For T = float and QuantizedFloat<unsigned char>.
template <typename T>
void slice(const Grid& grid, const Image<float>& lightness, float cellSize, Image<T>& smoothed);

/// The definition of `slice`.
template <typename T>
void sliceScalar(const Grid& grid, const Image<float>& lightness, float cellSize,
                 Image<T>& smoothed);

}  // namespace pelorin::image_processing
