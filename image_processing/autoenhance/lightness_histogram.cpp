#include "image_processing/autoenhance/lightness_histogram.h"

#include <algorithm>

#include "image_processing/autoenhance/companding_steps.h"
#include "image_processing/core/float_to_integer.h"

namespace pelorin::image_processing {
namespace {

// Counts as floats do that grow by 1: they stop at 2^24.
float asFloatCount(std::uint64_t count) {
  return static_cast<float>(std::min<std::uint64_t>(count, std::uint64_t{1} << 24));
}

}  // namespace

LightnessHistogram::LightnessHistogram(int bins, float scale) : binOfStep_(compandingStepCount) {
  const float lastBin = static_cast<float>(bins - 1);
  for (std::size_t step = 0; step < compandingStepCount; ++step) {
    const float bin = lastBin * lightnessOfSteps()[step] / scale;
    binOfStep_[step] = std::clamp(truncateTo<std::int32_t>(bin), 0, bins - 1);
  }
  for (auto& counts : counts_) counts.resize(bins);
}

void LightnessHistogram::add(const std::uint16_t* steps, std::size_t count) {
  std::size_t x = 0;
  for (; x + 4 <= count; x += 4) {
    for (std::size_t i = 0; i < 4; ++i) ++counts_[i][binOfStep_[steps[x + i]]];
  }
  for (; x < count; ++x) ++counts_[0][binOfStep_[steps[x]]];
  total_ += count;
}

std::vector<float> LightnessHistogram::normalised() const {
  const float total = asFloatCount(total_);
  const float share = total == 0.0f ? 1.0f : 1.0f / total;
  std::vector<float> histogram(counts_[0].size());
  for (std::size_t bin = 0; bin < histogram.size(); ++bin) {
    histogram[bin] =
        asFloatCount(counts_[0][bin] + counts_[1][bin] + counts_[2][bin] + counts_[3][bin]) * share;
  }
  return histogram;
}

}  // namespace pelorin::image_processing
