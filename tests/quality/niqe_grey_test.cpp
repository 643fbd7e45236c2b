#include "image_processing/quality/niqe_grey.h"

#include <gtest/gtest.h>

#include "tests/quality/float_images.h"
#include "tests/support/instruction_sets.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

TEST(NiqeGrey, AddsGreenThenRedThenBlue) {
  const RGBA8Pixel pixel = {10, 20, 30, 40};
  float grey;
  niqeGreyScalar(&pixel, &grey, 1);
  float expected = 20.0f * 0.6f;
  expected += 10.0f * 0.3f;
  expected += 30.0f * 0.1f;
  EXPECT_EQ(grey, expected);
}

TEST(NiqeGrey, IgnoresAlpha) {
  const RGBA8Pixel pixels[] = {{10, 20, 30, 0}, {10, 20, 30, 255}};
  float grey[2];
  niqeGreyScalar(pixels, grey, 2);
  EXPECT_EQ(grey[0], grey[1]);
}

TEST(NiqeGrey, MatchesItsDefinitionByteForByteOnEveryInstructionSet) {
  test_support::onEveryInstructionSet([] {
    for (std::size_t count = 0; count <= 130; ++count) {
      const auto pixels = test_support::randomPixels(count, /*seed=*/count);
      std::vector<float> expected(count + 1, -7.0f);  // the extra float catches an overrun
      std::vector<float> actual = expected;
      niqeGreyScalar(pixels.data(), expected.data(), count);
      niqeGrey(pixels.data(), actual.data(), count);
      ASSERT_TRUE(test_support::sameBytes(expected.data(), actual.data(), count + 1)) << count;
    }
  });
}

}  // namespace
}  // namespace pelorin::image_processing
