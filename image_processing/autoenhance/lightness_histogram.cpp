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

LightnessHistogram::LightnessHistogram(int bins, float scale)
    : bins_(bins), placeOfStep_(compandingStepCount) {
  const float lastBin = static_cast<float>(bins - 1);
  for (std::size_t step = 0; step < compandingStepCount; ++step) {
    const float place = lastBin * lightnessOfSteps()[step] / scale;
    const std::int32_t bin = std::clamp(truncateTo<std::int32_t>(place), 0, bins - 1);
    if (binOfPlace_.empty() || bin != binOfPlace_.back()) binOfPlace_.push_back(bin);
    placeOfStep_[step] = static_cast<std::uint16_t>(binOfPlace_.size() - 1);
  }
  for (auto& counts : counts_) counts.resize(binOfPlace_.size());
}

void LightnessHistogram::add(const std::uint16_t* steps, std::size_t count) {
  std::size_t x = 0;
  for (; x + 4 <= count; x += 4) {
    for (std::size_t i = 0; i < 4; ++i) ++counts_[i][placeOfStep_[steps[x + i]]];
  }
  for (; x < count; ++x) ++counts_[0][placeOfStep_[steps[x]]];
  total_ += count;
}

std::vector<float> LightnessHistogram::normalised() const {
  const float total = asFloatCount(total_);
  const float share = total == 0.0f ? 1.0f : 1.0f / total;
  std::vector<float> histogram(bins_);
  for (std::size_t place = 0; place < binOfPlace_.size(); ++place) {
    std::uint64_t count = 0;
    for (const auto& counts : counts_) count += counts[place];
    histogram[binOfPlace_[place]] = asFloatCount(count) * share;
  }
  return histogram;
}

}  // namespace pelorin::image_processing
