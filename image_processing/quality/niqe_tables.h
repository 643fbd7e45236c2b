#pragma once

#include <array>

#include "image_processing/core/sampled_curve.h"

namespace pelorin::image_processing {

// What the fit of a generalised Gaussian looks up. Its shape alpha runs from 0.1 (a spike with long
// tails) over 1 (Laplace) and 2 (normal) to 11 (nearly uniform).
//
// The tables are frozen: scores depend on their errors of interpolation, which are large near
// alpha = 0.1. They were made in double from the closed forms at alpha = 0.1, 0.2 ... 11.0.
// The scale and mean factors go linearly from those 110 samples to 150 equally spaced ones, and
// scale factor 0 is 0. The shapes are alpha as a monotone cubic function of the ratio (Fritsch and
// Carlson's scheme with weighted harmonic means as slopes and three-point slopes at the ends) at 50
// equally spaced ratios. NiqeTables.* derive every entry again.

/// Shapes the tables reach, and the width of that range.
constexpr float smallestShape = 0.1f, largestShape = 11.0f, shapeRange = 10.9f;

/// (mean of |x|)^2 / mean of x^2 at the smallest and at the largest shape, and their difference.
constexpr float smallestRatio = 0.0046119797f, largestRatio = 0.7420026f, ratioRange = 0.73739064f;

/// The shape alpha at equal steps of the ratio G(2/a)^2 / (G(1/a) G(3/a)), G the gamma function.
extern const std::array<float, 50> shapeFromRatioTable;
/// sqrt(G(1/a) / G(3/a)) at equal steps of alpha: scale of the distribution over its deviation.
extern const std::array<float, 150> scaleFactorTable;
/// log10(G(2/a) / G(1/a)) at equal steps of alpha: mean of |x| over the scale.
extern const std::array<float, 150> meanFactorTable;

/// False for NaN.
inline bool isTabulatedShape(float shape) {
  return shape >= smallestShape && shape <= largestShape;
}

/// @param ratio  within [smallestRatio, largestRatio].
inline float shapeFromRatio(float ratio) {
  return applyToneCurve(ratio - smallestRatio, shapeFromRatioTable, shapeFromRatioTable.size() - 1,
                        49.0f / ratioRange);
}

/// @param shape  tabulated.
inline float scaleFactor(float shape) {
  return applyToneCurve(shape - smallestShape, scaleFactorTable, scaleFactorTable.size() - 1,
                        149.0f / shapeRange);
}

/// The decimal logarithm of the factor. @param shape  tabulated.
inline float meanFactor(float shape) {
  return applyToneCurve(shape - smallestShape, meanFactorTable, meanFactorTable.size() - 1,
                        149.0f / shapeRange);
}

}  // namespace pelorin::image_processing
