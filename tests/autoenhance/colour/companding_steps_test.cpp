#include "image_processing/autoenhance/colour/companding_steps.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <vector>

#include "image_processing/autoenhance/colour/lab.h"
#include "tests/support/instruction_sets.h"
#include "tests/support/pictures.h"
#include "tests/support/slow_build.h"

namespace pelorin::image_processing {
namespace {

using test_support::onEveryInstructionSet;
using test_support::randomPixels;

TEST(CompandingSteps, MatchTheirDefinitionAtEveryTailLength) {
  for (std::size_t count = 0; count <= 70; ++count) {
    const auto pixels = randomPixels(count, count);
    std::vector<std::uint16_t> expected(count + 1, 0xABCD);
    compandingStepsScalar(pixels.data(), expected.data(), count);
    onEveryInstructionSet(
        [&] {
          std::vector<std::uint16_t> actual(count + 1, 0xABCD);
          compandingSteps(pixels.data(), actual.data(), count);
          ASSERT_EQ(actual, expected) << count;
        },
        HWY_AVX3_DL);
  }
}

TEST(CompandingSteps, MatchTheirDefinitionForMillionsOfColours) {
  const std::size_t count = test_support::slowBuild ? 1 << 16 : 1 << 22;
  const auto pixels = randomPixels(count, 1);
  std::vector<std::uint16_t> expected(count), actual(count);
  compandingStepsScalar(pixels.data(), expected.data(), count);
  onEveryInstructionSet(
      [&] {
        compandingSteps(pixels.data(), actual.data(), count);
        ASSERT_EQ(actual, expected);
      },
      HWY_AVX3_DL);
}

TEST(CompandingSteps, DetermineLightness) {
  for (const RGBA8Pixel& p : randomPixels(5000, 2)) {
    std::uint16_t step;
    compandingStepsScalar(&p, &step, 1);
    const float L = rgbToLab(p.r, p.g, p.b).L;
    ASSERT_EQ(lightnessOfSteps()[step], L);
    ASSERT_EQ(unitLightnessOfSteps()[step], L / 100.0f);
  }
}

}  // namespace
}  // namespace pelorin::image_processing
