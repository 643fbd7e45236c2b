#include "image_processing/filters/looks/soft_light.h"

#include <gtest/gtest.h>

namespace pelorin::image_processing {
namespace {

TEST(SoftLight, LeavesAChannelAloneAtHalf) {
  for (int x = 0; x < 256; ++x) EXPECT_NEAR(softLight(x, 0.5f), x, 1e-4) << x;
}

TEST(SoftLight, DarkensBelowHalfAndLightensAbove) {
  for (int x = 1; x < 255; ++x) {
    EXPECT_LT(softLight(x, 0.2f), x) << x;
    EXPECT_GT(softLight(x, 0.8f), x) << x;
  }
}

TEST(SoftLight, KeepsBlackAndWhite) {
  for (const float mask : {0.0f, 0.2f, 0.5f, 0.8f, 1.0f}) {
    EXPECT_EQ(softLight(0.0f, mask), 0.0f) << mask;
    EXPECT_NEAR(softLight(255.0f, mask), 255.0f, 1e-3f) << mask;
  }
}

TEST(SoftLight, IsTheSquareInTheDarkestMask) {
  for (int x = 0; x < 256; ++x) EXPECT_NEAR(softLight(x, 0.0f), x * x / 255.0, 1e-3) << x;
}

TEST(SoftLight, ChangesFromThePolynomialToTheRootAtAQuarter) {
  // Both meet at 63.75, up to the rounding of their constants.
  EXPECT_NEAR(softLight(63.75f, 1.0f), 15.9687195 * 7.98435970, 1e-2);
  EXPECT_FLOAT_EQ(softLight(64.0f, 1.0f), 15.9687195f * 8.0f);
  EXPECT_NEAR(softLight(30.0f, 1.0f), ((0.0002460592 * 30 - 0.047058824) * 30 + 4) * 30, 1e-4);
}

TEST(VignetteChannel, LeavesTheChannelAloneAtOpacityZero) {
  for (int x = 0; x < 256; ++x) {
    for (int m = 0; m <= 100; ++m) {
      EXPECT_EQ(vignetteChannel(x, 0.01f * m, 0.0f), static_cast<float>(x));
    }
  }
}

TEST(VignetteChannel, IsTheWholeBlendAtOpacityOne) {
  for (int x = 0; x < 256; ++x) EXPECT_EQ(vignetteChannel(x, 0.3f, 1.0f), softLight(x, 0.3f));
}

}  // namespace
}  // namespace pelorin::image_processing
