#include "image_processing/autoenhance/colour/vibrance.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "image_processing/core/pixel_types.h"

namespace pelorin::image_processing {
namespace {

RGBA8Pixel vibrant(float amount, RGBA8Pixel p) {
  vibranceInRGB(amount, p.r, p.g, p.b);
  return p;
}

TEST(Vibrance, LeavesGreyPixelsAlone) {
  for (int grey = 0; grey < 256; ++grey) {
    const auto code = static_cast<std::uint8_t>(grey);
    const RGBA8Pixel p{code, code, code, 7};
    for (const float amount : {0.0f, 0.5f, 1.0f, 1.8f, -3.0f, 1e30f, std::nanf("")}) {
      ASSERT_EQ(vibrant(amount, p), p);
    }
  }
}

TEST(Vibrance, BelowOneDesaturatesByExactlyThatFactorWithoutRedProtection) {
  for (const RGBA8Pixel& p :
       {RGBA8Pixel{200, 40, 90, 0}, {10, 250, 30, 0}, {3, 4, 200, 0}, {90, 90, 91, 0}}) {
    const float amount = 0.6f;
    const float grey = 0.7f * p.g + 0.2f * p.r + 0.1f * p.b;
    const RGBA8Pixel out = vibrant(amount, p);
    EXPECT_EQ(out.r, static_cast<int>(grey + amount * (p.r - grey)));
    EXPECT_EQ(out.g, static_cast<int>(grey + amount * (p.g - grey)));
    EXPECT_EQ(out.b, static_cast<int>(grey + amount * (p.b - grey)));
  }
}

TEST(Vibrance, AboveOneLeavesRedderPixelsAlone) {
  const RGBA8Pixel p{200, 140, 120, 0};
  const RGBA8Pixel out = vibrant(1.8f, p);
  EXPECT_NEAR(out.r, p.r, 1);
  EXPECT_NEAR(out.g, p.g, 1);
  EXPECT_NEAR(out.b, p.b, 1);
}

TEST(Vibrance, FadesRedProtectionOutOverFiveCodes) {
  int before = 0;
  for (int lead = 0; lead <= 6; ++lead) {  // how far green leads red
    const auto green = static_cast<std::uint8_t>(120 + lead);
    const RGBA8Pixel out = vibrant(1.8f, {120, green, 60, 0});
    const int gained = 60 - out.b;
    EXPECT_GE(gained, before);
    EXPECT_TRUE(lead > 0 || gained <= 1);
    before = gained;
  }
  EXPECT_GT(before, 30);
}

TEST(Vibrance, GoesNoFurtherThanTheFirstChannelAtAnEnd) {
  const RGBA8Pixel out = vibrant(50.0f, {20, 100, 180, 0});
  EXPECT_TRUE(out.r == 0 || out.b >= 254);
  EXPECT_LT(out.g, 255);
}

TEST(Vibrance, WrapsOnlyForNegativeAmounts) {
  const RGBA8Pixel p{0, 0, 255, 0};  // grey 25.5; at -1 blue falls to 0 and red rises to 51
  EXPECT_EQ(vibrant(-1.0f, p), (RGBA8Pixel{51, 51, 0, 0}));
  // Grey 25.5 and amount -20: red would be 535, of which the low 8 bits stay.
  EXPECT_EQ(vibrant(-20.0f, p).r, 535 & 255);
}

TEST(Vibrance, GivesDefinedBytesForNaNAndInfinity) {
  const RGBA8Pixel p{30, 90, 200, 0};
  EXPECT_EQ(vibrant(std::nanf(""), p), (RGBA8Pixel{0, 0, 0, 0}));
  const float infinity = std::numeric_limits<float>::infinity();
  EXPECT_EQ(vibrant(infinity, p), vibrant(1e30f, p));
  EXPECT_EQ(vibrant(-infinity, p), (RGBA8Pixel{255, 0, 0, 0}));
}

}  // namespace
}  // namespace pelorin::image_processing
