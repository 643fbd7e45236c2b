#include "image_processing/autoenhance/masks/flatness_mask.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <new>

#include "tests/autoenhance/masks/geometries.h"
#include "tests/support/fingerprint.h"
#include "tests/support/instruction_sets.h"
#include "tests/support/mask_types.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::Quantized;

using test_support::fingerprint;
using test_support::geometries;
using test_support::Geometry;
using test_support::lightnessOf;
using test_support::onEveryInstructionSet;
using test_support::Random;

TEST(FlatnessMask, IsCentredOnePixelRightOfAndBelow) {
  // One pixel of detail at (20, 15): it lowers the mask where its window reaches, and no further.
  Image<float> lightness(40, 30), smoothed(40, 30), mask(40, 30);
  lightness.set(0.5f);
  smoothed.set(0.5f);
  lightness.row(15)[20] = 0.9f;
  const int r = 2;
  computeFlatnessMask(lightness, smoothed, r, mask);
  const auto lowered = [&](int x, int y) { return mask.row(y)[x] < 0.99f; };
  for (int y = 5; y < 25; ++y) {
    for (int x = 5; x < 35; ++x) {
      const bool inWindow =
          x + 1 - r <= 20 && 20 <= x + 1 + r && y + 1 - r <= 15 && 15 <= y + 1 + r;
      ASSERT_EQ(lowered(x, y), inWindow) << x << ", " << y;
    }
  }
}

TEST(FlatnessMask, StopsCountingAPixelAtTwentyOf255) {
  Image<float> lightness(20, 20), smoothed(20, 20), mask(20, 20);
  smoothed.set(0.5f);
  lightness.set(0.5f + 20.0f / 255.0f);
  computeFlatnessMask(lightness, smoothed, 3, mask);
  EXPECT_NEAR(mask.row(10)[10], 0.0f, 1e-5f);
}

TEST(FlatnessMask, TakesAnyRadius) {
  const Image<float> smoothed = [] {
    Image<float> image(9, 7);
    image.set(0.5f);
    return image;
  }();
  Image<float> lightness(9, 7), mask(9, 7);
  lightness.set(0.5f);
  for (const int radius : {0, 1, 5, 100}) {  // also far beyond the picture
    computeFlatnessMask(lightness, smoothed, radius, mask);
    EXPECT_NEAR(mask.row(3)[4], 1.0f, 1e-2f) << radius;
  }
  computeFlatnessMask(lightness, smoothed, -1, mask);
  EXPECT_EQ(mask.row(3)[4], 0.0f);
  if (sizeof(void*) == 8) {
    EXPECT_THROW(computeFlatnessMask(lightness, smoothed, 2147483647, mask), std::bad_alloc);
  }
}

template <typename T>
class FlatnessMaskOf : public testing::Test {};
TYPED_TEST_SUITE(FlatnessMaskOf, test_support::MaskTypes);

TYPED_TEST(FlatnessMaskOf, MatchesItsDefinition) {
  for (const Geometry& g : geometries) {
    for (const int radius : {-1, 0, 1, 2, 3, 8, 40}) {
      const Image<float> lightness = lightnessOf(g, 1);
      Image<TypeParam> smoothed(g.width, g.height);
      Random random(radius + 2);
      for (std::size_t i = 0; i < smoothed.pixelCount(); ++i) {
        smoothed.data.get()[i] =
            std::min(lightness.data.get()[i] + 0.1f * (random.nextFloat() - 0.5f), 1.0f);
      }
      Image<TypeParam> expected(g.width, g.height);
      computeFlatnessMaskScalar(lightness, smoothed, radius, expected);
      const auto compare = [&] {
        Image<TypeParam> actual(g.width, g.height);
        computeFlatnessMask(lightness, smoothed, radius, actual);
        ASSERT_EQ(fingerprint(actual), fingerprint(expected))
            << g.width << " x " << g.height << ", radius " << radius;
      };
      if (radius < 0) {
        compare();  // without a kernel
      } else {
        onEveryInstructionSet(compare);
      }
    }
  }
}

}  // namespace
}  // namespace pelorin::image_processing
