#pragma once

#include "image_processing/autoenhance/masks/gaussian_approximation.h"
#include "image_processing/autoenhance/masks/grid.h"
#include "image_processing/core/workers.h"

namespace pelorin::image_processing {

/// The bell of five taps in space, of which the outer two weigh 0.
inline GaussianApproximation<float> spatialBell() {
  return {-2.0f, 2.0f, 0.0f, 1.0f};
}

/// How many bins away lightness still counts: 32 · `sigmaRange`, truncated.
inline std::int64_t rangeRadius(float sigmaRange) {
  return truncateTo<std::int32_t>(sigmaRange * static_cast<float>(gridBins));
}

/// The bell in lightness.
inline GaussianApproximation<float> rangeBell(std::int64_t radius) {
  const float support = static_cast<float>(radius);
  return {-support, support, 0.0f, 1.0f};
}

/// Blurs values and weights alike along columns, rows and lightness, in that order: with
/// `spatialBell` in space, mirrored at the borders, and `rangeBell` in lightness, where nothing
/// lies beyond the ends. A radius of 0 or less leaves 0 in every node. Nodes hold finite numbers
/// from 0 on. @throws std::bad_alloc for one line of cells.
/// @param workers  share the work; null for none.
void blur(Grid& grid, float sigmaRange, Workers* workers = nullptr);

/// The definition of `blur`.
void blurScalar(Grid& grid, float sigmaRange);

}  // namespace pelorin::image_processing
