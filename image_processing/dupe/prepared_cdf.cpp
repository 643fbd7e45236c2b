#include "image_processing/dupe/prepared_cdf.h"

#include <algorithm>
#include <cmath>

#include "image_processing/dupe/cdf_distance.h"

namespace pelorin::image_processing {
namespace {

constexpr double gainTolerance = 0.0001;
constexpr int mostGainUpdates = 500;

/// `KSTest` of `mapped`, once it is clipped, and `clipped`, in one go. The largest of differences is
/// the same in any order, so that several lanes look for theirs.
float distanceOfClipped(const GreenCDF& mapped, const GreenCDF& clipped) {
  constexpr std::size_t lanes = 8, begin = clippedBins;
  constexpr std::size_t end = std::tuple_size_v<GreenCDF> - clippedBins;
  static_assert((end - begin) % lanes == 0);
  const float low = mapped[begin];
  const float range = mapped[end - 1] - low;
  if (range <= 0.0f) return KSTest(mapped, clipped, clippedBins);
  std::array<float, lanes> largest{};
  for (std::size_t i = begin; i < end; i += lanes) {
    for (std::size_t lane = 0; lane < lanes; ++lane) {
      const float entry = std::clamp((mapped[i + lane] - low) / range, 0.0f, 1.0f);
      const float difference = std::fabs(entry - clipped[i + lane]);
      largest[lane] = difference > largest[lane] ? difference : largest[lane];
    }
  }
  return *std::max_element(largest.begin(), largest.end());
}

}  // namespace

GainSamples gainSamplesOf(const Quantiles& quantiles) {
  GainSamples samples;
  for (std::size_t i = 0; i < samples.size(); ++i) samples[i] = quantiles[gainLevels[i]];
  return samples;
}

float fitGain(const GainSamples& from, const GainSamples& to) {
  float gain = 1.0f, previous = -1.0f;
  for (int update = 0; update < mostGainUpdates; ++update) {
    const double change = std::fabs(static_cast<double>(gain) - static_cast<double>(previous));
    if (!(change > gainTolerance)) break;
    float numerator = 0.0f, denominator = 0.0f;
    for (std::size_t i = 0; i < from.size(); ++i) {
      const float scaled = std::min(gain * from[i], lastIntensity);
      denominator += scaled * scaled;
      numerator += scaled * to[i];
    }
    if (denominator == 0.0f) break;
    previous = gain;
    gain = gain * numerator / denominator;
  }
  return gain;
}

GreenCDF withGain(const Quantiles& quantiles, float gain) {
  Quantiles gained;
  for (std::size_t i = 0; i < gained.size(); ++i) {
    gained[i] = std::min(gain * quantiles[i], lastIntensity);
  }
  GreenCDF mapped;
  invert(gained, mapped);
  constexpr double share = static_cast<double>(1.0f / lastIntensity);
  for (float& entry : mapped) entry = static_cast<float>(entry * share);
  return mapped;
}

PreparedCDF::PreparedCDF(const GreenCDF& cdf) : clipped(cdf) {
  invert(cdf, quantiles);
  gainSamples = gainSamplesOf(quantiles);
  clipCDF(clipped, clippedBins);
}

float exposureInvariantCDFDistance(const PreparedCDF& a, const PreparedCDF& b) {
  const float gainA = fitGain(a.gainSamples, b.gainSamples);
  const float gainB = fitGain(b.gainSamples, a.gainSamples);
  if (gainA > gainB) return distanceOfClipped(withGain(a.quantiles, gainA), b.clipped);
  return distanceOfClipped(withGain(b.quantiles, gainB), a.clipped);
}

}  // namespace pelorin::image_processing
