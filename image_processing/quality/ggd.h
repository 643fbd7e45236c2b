#pragma once

#include <cstdint>

#include "image_processing/core/export.h"
#include "image_processing/core/image.h"

namespace pelorin::image_processing {

/// An asymmetric generalised Gaussian: one shape, a scale on either side of 0. NaN where there is
/// no fit.
struct Ggd {
  float shape, left, right;
};

/// What a fit needs to know of the values x of a block. Sums run over the block row by row in
/// float, each by itself.
struct BlockSums {
  float absolute = 0.0f;      ///< Sum of |x|.
  float squares = 0.0f;       ///< Sum of x^2.
  float leftSquares = 0.0f;   ///< Sum of x^2 over x < 0.
  float rightSquares = 0.0f;  ///< Sum of x^2 over x > 0.
  std::uint32_t left = 0;     ///< How many x < 0.
  std::uint32_t right = 0;    ///< How many x > 0.
};

/// The distribution whose moments match those of `count` values: no fit when one side is empty or
/// the ratio of the moments belongs to no shape from 0.1 to 11. (Lasmar, Stitou and Berthoumieu,
/// "Multiscale skewed heavy tailed model for texture analysis", 2009.)
Ggd fitGgd(const BlockSums& sums, float count);

/// Mean of a distribution, (right - left) times a factor of the shape; NaN when there is no fit or
/// the mean is above 0.3 in magnitude.
float ggdMean(const Ggd& fit);

/// Fits the values of a block; outputs are NaN when there is no fit. Never throws; pure.
PELORIN_EXPORT void ggdParams(const Image<float>& block, float& shape, float& leftScale,
                              float& rightScale);

}  // namespace pelorin::image_processing
