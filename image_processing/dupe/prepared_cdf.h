#pragma once

#include <array>
#include <cstddef>

#include "image_processing/dupe/green_cdf.h"
#include "image_processing/dupe/quantiles.h"

namespace pelorin::image_processing {

// The parts of a distance between two photos' distributions (`cdf_distance.h`). All are pure and never
// throw; any float is accepted.

/// Entries at each end of a distribution that the distance does not look at.
constexpr int clippedBins = 8;

constexpr float lastIntensity = 255.0f;

/// Where quantile functions are compared: 11 levels, floor(k · 25.5).
constexpr std::array<std::size_t, 11> gainLevels = {0,   25,  51,  76,  102, 127,
                                                    153, 178, 204, 229, 255};

/// The quantiles at `gainLevels`.
using GainSamples = std::array<float, gainLevels.size()>;

GainSamples gainSamplesOf(const Quantiles& quantiles);

/// The gain that brings the quantiles `from` closest to `to`; 1 when it cannot be fitted.
float fitGain(const GainSamples& from, const GainSamples& to);

/// The distribution whose quantiles are `quantiles` times `gain`. A gain below 1 is stretched back
/// over the full range, because an inverse always ends at the last intensity.
GreenCDF withGain(const Quantiles& quantiles, float gain);

/// What of the distance depends on one photo alone, for those that are compared with many.
struct PreparedCDF {
  explicit PreparedCDF(const GreenCDF& cdf);

  Quantiles quantiles;
  GainSamples gainSamples;
  GreenCDF clipped;  ///< At both ends.
};

/// The distance between what `a` and `b` were made from, bit for bit.
float exposureInvariantCDFDistance(const PreparedCDF& a, const PreparedCDF& b);

}  // namespace pelorin::image_processing
