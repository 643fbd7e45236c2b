#include "image_processing/autoenhance/lightness/lightness_histogram.h"

#include <gtest/gtest.h>

#include <algorithm>
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

constexpr std::uint16_t black = 0, white = compandingStepCount - 1;

TEST(LightnessHistogram, GivesEachBinItsShare) {
  LightnessHistogram histogram(lightnessBins, lightnessScale);
  EXPECT_TRUE(histogram.empty());
  EXPECT_EQ(histogram.normalised(), std::vector<float>(lightnessBins));
  const std::uint16_t steps[] = {black, white, black, black};
  histogram.add(steps, 3);
  histogram.add(steps + 3, 1);
  EXPECT_FALSE(histogram.empty());
  std::vector<float> expected(lightnessBins);
  expected.front() = 0.75f;
  expected.back() = 0.25f;
  EXPECT_EQ(histogram.normalised(), expected);
}

TEST(LightnessHistogram, TruncatesToABinAndHoldsWhatIsAboveTheScaleToTheLast) {
  for (const float scale : {100.0f, 50.0f}) {
    for (std::size_t step = 0; step < compandingStepCount; step += 101) {
      const float lightness = lightnessOfSteps()[step];
      LightnessHistogram histogram(10, scale);
      const auto counted = static_cast<std::uint16_t>(step);
      histogram.add(&counted, 1);
      const auto bin = static_cast<std::size_t>(9.0f * lightness / scale);
      ASSERT_EQ(histogram.normalised()[std::min<std::size_t>(bin, 9)], 1.0f) << lightness;
    }
  }
}

TEST(LightnessHistogram, CountsAsFloatsDo) {
  // 2^24 + 1 is no float: a bin that holds more stops there.
  const std::vector<float> shares = normalised({(1u << 24) + 5, 1u << 22});
  EXPECT_EQ(shares[0], 16777216.0f * (1.0f / 16777216.0f));
  EXPECT_EQ(shares[1], 0.25f);
}

TEST(LightnessHistogramSimd, FindsTheBinOfEveryStep) {
  std::vector<std::uint16_t> steps(compandingStepCount);
  std::iota(steps.begin(), steps.end(), std::uint16_t{0});
  const LightnessHistogram none(lightnessBins, lightnessScale);
  for (std::size_t step = 0; step < compandingStepCount; ++step) {
    LightnessHistogram expected = none;  // to make one takes longer
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
