#pragma once

#include <cstdint>

#include "image_processing/core/image.h"
#include "image_processing/core/rows.h"
#include "image_processing/quality/block_features.h"

namespace pelorin::image_processing {

/// True when a picture has a whole block.
inline bool isScorable(std::uint32_t width, std::uint32_t height) {
  return width >= niqeBlockSize && height >= niqeBlockSize;
}
inline bool isScorable(const Image<RGBA8Pixel>& image) {
  return isScorable(image.width, image.height);
}

/// The 36 features, a row each, of every block of 96 x 96 pixels, a column each, in raster order:
/// 18 of the picture, then 18 of its half, where a block is 48 x 48. Pixels right of and below the
/// last whole block only influence the blocks beside them.
/// @param image  scorable.
/// @throws std::bad_alloc for about 220 rows of floats beside the features. Pure.
Image<float> niqeFeatures(const Image<RGBA8Pixel>& image);

/// The same of a picture that comes as rows; all are read. @throws what the source throws as well.
Image<float> niqeFeaturesOfRows(std::uint32_t width, std::uint32_t height, RowSource& rows);

/// The definition of `niqeFeatures`, in steps over the whole picture.
Image<float> niqeFeaturesScalar(const Image<RGBA8Pixel>& image);

}  // namespace pelorin::image_processing
