#include "image_processing/autoenhance/lightness/lightness_histogram.h"

#include <algorithm>
#include <functional>
#include <numeric>

#include "image_processing/autoenhance/colour/companding_steps.h"
#include "image_processing/core/float_counter.h"
#include "image_processing/core/float_to_integer.h"
#include "image_processing/core/require.h"

namespace pelorin::image_processing {
namespace {

void addTo(std::vector<std::uint64_t>& counts, const std::vector<std::uint64_t>& others) {
  std::transform(counts.begin(), counts.end(), others.begin(), counts.begin(), std::plus<>());
}

std::uint64_t sum(const std::vector<std::uint64_t>& counts) {
  return std::accumulate(counts.begin(), counts.end(), std::uint64_t{0});
}

}  // namespace

LightnessHistogram::LightnessHistogram(int bins, float scale) : binOfStep_(compandingStepCount) {
  require(bins > 0, "statistics: there must be at least one bin");
  counts_.resize(static_cast<std::size_t>(bins));
  const float lastBin = static_cast<float>(bins - 1);
  for (std::size_t step = 0; step < compandingStepCount; ++step) {
    const float bin = lastBin * lightnessOfSteps()[step] / scale;
    binOfStep_[step] = std::clamp(truncateTo<std::int32_t>(bin), 0, bins - 1);
  }
}

void LightnessHistogram::add(const std::uint16_t* steps, std::size_t count, std::uint64_t times) {
  for (std::size_t i = 0; i < count; ++i) counts_[binOfStep_[steps[i]]] += times;
}

void LightnessHistogram::add(const LightnessHistogram& other) {
  addTo(counts_, other.counts_);
}

void LightnessHistogramSimd::add(const LightnessHistogramSimd& other) {
  addTo(counts_, other.counts_);
}

bool LightnessHistogram::empty() const {
  return sum(counts_) == 0;
}

std::vector<float> LightnessHistogram::normalised() const {
  return image_processing::normalised(counts_);
}

std::vector<float> normalised(const std::vector<std::uint64_t>& counts) {
  const float total = asFloatCounter(sum(counts));
  const float share = total == 0.0f ? 1.0f : 1.0f / total;
  std::vector<float> histogram(counts.size());
  std::transform(counts.begin(), counts.end(), histogram.begin(),
                 [&](std::uint64_t count) { return asFloatCounter(count) * share; });
  return histogram;
}

}  // namespace pelorin::image_processing
