#pragma once

#include <array>
#include <cstdint>

#include "image_processing/core/export.h"
#include "image_processing/core/image.h"

namespace pelorin::image_processing {

constexpr std::uint32_t niqeFeaturesPerScale = 18;
constexpr std::uint32_t niqeBlockSize = 96;

/// The neighbours a coefficient is multiplied with, in the order of the features. The first stands
/// for the coefficient itself.
struct NeighbourShift {
  int dy, dx;
};
constexpr std::array<NeighbourShift, 5> niqeShifts = {{{0, 0}, {0, 1}, {1, 0}, {1, 1}, {1, -1}}};

/// Copies a block out of a structure image, or multiplies each of its coefficients with the one
/// `dy` rows up and `dx` columns to the left, which wraps round inside the block.
/// @param x0, y0  top left of the block in the structure image.
/// @param block   written; its size is that of the block. NaN when the block reaches past the
///                structure image.
/// Never throws; pure.
PELORIN_EXPORT void buildBlock(const Image<float>& structure, std::uint32_t x0, std::uint32_t y0,
                               int dy, int dx, Image<float>& block);

/// The features of every block at one scale. Blocks tile the structure image from its top left;
/// block k = row * `blockColumns` + column fills column k of rows `featuresPerScale` * `scale` and
/// following of the feature image:
///
///     row 0                shape of the coefficients
///     row 1                half the sum of their scales
///     row 2, 6, 10, 14     shape of the products with each of the four neighbours
///     the three rows after mean (NaN above 0.3 in magnitude), left and right scale of the products
///
/// @param structure         coefficients of this scale.
/// @param featuresPerScale  18; sets the first row only.
/// @param blockSize         side of a block at scale 0; at scale s it is this over s + 1.
/// @param features          `blockColumns` * `blockRows` wide, 18 rows from the first one on.
/// A feature that cannot be had is NaN, as are all of a block that reaches past the structure.
/// Squares below 1.2e-38, which coefficients of pictures never have, may count as 0 on 32-bit ARM.
/// @throws std::bad_alloc; std::invalid_argument when the feature image is smaller. Pure.
PELORIN_EXPORT void computeBlockFeatures(const Image<float>& structure,
                                         std::uint32_t featuresPerScale, std::uint32_t blockSize,
                                         std::uint32_t blockColumns, std::uint32_t blockRows,
                                         std::uint32_t scale, Image<float>& features);

/// Refuses a feature image that has no room for these rows and columns. @throws
/// std::invalid_argument.
void requireRoomForFeatures(const Image<float>& features, std::uint32_t featuresPerScale,
                            std::uint32_t blockColumns, std::uint32_t blockRows,
                            std::uint32_t scale);

/// The definition of `computeBlockFeatures`.
void computeBlockFeaturesScalar(const Image<float>& structure, std::uint32_t featuresPerScale,
                                std::uint32_t blockSize, std::uint32_t blockColumns,
                                std::uint32_t blockRows, std::uint32_t scale,
                                Image<float>& features);

}  // namespace pelorin::image_processing
