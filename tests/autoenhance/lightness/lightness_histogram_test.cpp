#include "image_processing/autoenhance/lightness/lightness_histogram.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <numeric>
#include <vector>

#include "image_processing/autoenhance/colour/companding_steps.h"
#include "tests/support/instruction_sets.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::onEveryInstructionSet;
using test_support::Random;

TEST(LightnessHistogramSimd, FindsTheBinOfEveryStep) {
  std::vector<std::uint16_t> steps(compandingStepCount);
  std::iota(steps.begin(), steps.end(), std::uint16_t{0});
  for (std::size_t step = 0; step < compandingStepCount; ++step) {
    LightnessHistogram expected(lightnessBins, lightnessScale);
    expected.add(&steps[step], 1);
    LightnessHistogramSimd counter;
    counter.add(&unitLightnessOfSteps()[step], 1);
    ASSERT_EQ(normalised(counter.counts()), expected.normalised()) << step;
  }
  LightnessHistogram expected(lightnessBins, lightnessScale);
  expected.add(steps.data(), steps.size());
  onEveryInstructionSet([&] {
    LightnessHistogramSimd counter;
    counter.add(unitLightnessOfSteps().data(), compandingStepCount);
    ASSERT_EQ(normalised(counter.counts()), expected.normalised());
  });
}

TEST(LightnessHistogramSimd, MatchesTheHistogramAtEveryTailLength) {
  Random random(3);
  for (std::size_t count = 0; count <= 1100; count += count < 140 ? 1 : 37) {
    std::vector<std::uint16_t> steps(count);
    for (auto& step : steps) step = static_cast<std::uint16_t>(random.below(compandingStepCount));
    std::vector<float> lightness(count);
    unitLightness(steps.data(), lightness.data(), count);
    LightnessHistogram expected(lightnessBins, lightnessScale);
    expected.add(steps.data(), count);
    onEveryInstructionSet([&] {
      LightnessHistogramSimd counter;
      counter.add(lightness.data(), count);
      if (count == 0) unitLightness(nullptr, nullptr, 0);  // some kernel is to be called
      ASSERT_EQ(normalised(counter.counts()), expected.normalised()) << count;
    });
  }
}

}  // namespace
}  // namespace pelorin::image_processing
