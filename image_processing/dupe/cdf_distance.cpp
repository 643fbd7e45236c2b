#include "image_processing/dupe/cdf_distance.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <span>

namespace pelorin::image_processing {
namespace {

/// Entries at each end of a distribution that the distance does not look at.
constexpr int clippedBins = 8;

/// Where quantile functions are compared: 11 levels, floor(k · 25.5).
constexpr std::array<std::size_t, 11> gainSamples = {0,   25,  51,  76,  102, 127,
                                                     153, 178, 204, 229, 255};
constexpr double gainTolerance = 0.0001;
constexpr int mostGainUpdates = 500;

/// Intensity by share of pixels: the inverse of a distribution.
using Quantiles = std::array<float, 256>;
constexpr float lastIntensity = 255.0f;

void invert(std::span<const float> v, std::span<float> inverse) {
  const std::size_t n = v.size();
  if (n == 0) return;
  const float last = static_cast<float>(n - 1);
  const float step = v[n - 1] / last;
  std::size_t j = 0;
  for (std::size_t i = 0; i + 1 < n; ++i) {
    const float target = static_cast<float>(i) * step;
    while (j < n && v[j] < target) ++j;
    if (j == 0) {
      inverse[i] = 0.0f;
    } else if (j == n) {
      inverse[i] = last;  // never reached: only where `v` ends below 0
    } else {
      const float low = v[j - 1], rise = v[j] - low;
      inverse[i] = rise != 0.0f ? static_cast<float>(j - 1) + (target - low) / rise
                                : static_cast<float>(j) - 0.5f;
    }
  }
  inverse[n - 1] = last;
}

Quantiles quantilesOf(const GreenCDF& cdf) {
  Quantiles quantiles;
  invert(cdf, quantiles);
  return quantiles;
}

float fitGain(const Quantiles& from, const Quantiles& to) {
  float gain = 1.0f, previous = -1.0f;
  for (int update = 0; update < mostGainUpdates; ++update) {
    const double change = std::fabs(static_cast<double>(gain) - static_cast<double>(previous));
    if (!(change > gainTolerance)) break;
    float numerator = 0.0f, denominator = 0.0f;
    for (const std::size_t sample : gainSamples) {
      const float scaled = std::min(gain * from[sample], lastIntensity);
      denominator += scaled * scaled;
      numerator += scaled * to[sample];
    }
    if (denominator == 0.0f) break;
    previous = gain;
    gain = gain * numerator / denominator;
  }
  return gain;
}

/// The distribution whose quantiles are `quantiles` times `gain`. A gain below 1 is stretched back
/// over the full range, because an inverse always ends at the last intensity.
GreenCDF withGain(Quantiles quantiles, float gain) {
  for (float& quantile : quantiles) quantile = std::min(gain * quantile, lastIntensity);
  GreenCDF mapped;
  invert(quantiles, mapped);
  constexpr double share = static_cast<double>(1.0f / lastIntensity);
  for (float& entry : mapped) entry = static_cast<float>(entry * share);
  return mapped;
}

float clippedDistance(GreenCDF a, GreenCDF b) {
  clipCDF(a, clippedBins);
  clipCDF(b, clippedBins);
  return KSTest(a, b, clippedBins);
}

}  // namespace

void clipCDF(GreenCDF& cdf, int k) {
  if (k < 0 || k > 128) return;
  const float low = cdf[k];
  const float range = cdf[255 - k] - low;
  if (range <= 0.0f) return;
  for (float& entry : cdf) entry = std::clamp((entry - low) / range, 0.0f, 1.0f);
}

float KSTest(const GreenCDF& a, const GreenCDF& b, int k) {
  const std::int64_t margin = std::abs(std::int64_t{k});
  float largest = 0.0f;
  for (std::int64_t i = margin; margin <= 127 && i < 256 - margin; ++i) {
    const float difference = std::fabs(a.at(i) - b.at(i));
    if (difference > largest) largest = difference;
  }
  return largest;
}

std::vector<float> invertCDF(const std::vector<float>& v) {
  std::vector<float> inverse(v.size());
  invert(v, inverse);
  return inverse;
}

float matchCDFDomain(const GreenCDF& a, const GreenCDF& b, GreenCDF* mapped) {
  const Quantiles quantiles = quantilesOf(a);
  const float gain = fitGain(quantiles, quantilesOf(b));
  if (mapped != nullptr) *mapped = withGain(quantiles, gain);
  return gain;
}

// The same as two calls of `matchCDFDomain`, without inverting or mapping twice.
float exposureInvariantCDFDistance(const GreenCDF& a, const GreenCDF& b) {
  const Quantiles quantilesA = quantilesOf(a), quantilesB = quantilesOf(b);
  const float gainA = fitGain(quantilesA, quantilesB), gainB = fitGain(quantilesB, quantilesA);
  if (gainA > gainB) return clippedDistance(withGain(quantilesA, gainA), b);
  return clippedDistance(a, withGain(quantilesB, gainB));
}

}  // namespace pelorin::image_processing
