#include "cli/pictures/colour_scale.h"

#include <gtest/gtest.h>

#include <limits>

namespace pelorin::cli {
namespace {

constexpr float nan = std::numeric_limits<float>::quiet_NaN();
constexpr float infinity = std::numeric_limits<float>::infinity();

TEST(ColourScale, RunsFromBlueOverYellowToRed) {
  const ColourScale scale = {10, 20};
  const Colour low = scale(10), middle = scale(15), high = scale(20);
  EXPECT_GT(low.b, low.r + 0.3);
  EXPECT_GT(middle.r, middle.b + 0.3);
  EXPECT_GT(middle.g, middle.b + 0.3);
  EXPECT_GT(high.r, high.g + 0.3);
  EXPECT_GT(high.r, high.b + 0.3);
}

TEST(ColourScale, KeepsTheColoursOfItsEndsBeyondThem) {
  const ColourScale scale = {10, 20};
  EXPECT_EQ(scale(-1e30).r, scale(10).r);
  EXPECT_EQ(scale(infinity).r, scale(20).r);
}

TEST(ColourScale, ChangesGraduallyAllAlong) {
  const ColourScale scale = {0, 1000};
  for (int value = 0; value < 1000; ++value) {
    const Colour a = scale(value), b = scale(value + 1);
    EXPECT_NEAR(a.r, b.r, 0.01);
    EXPECT_NEAR(a.g, b.g, 0.01);
    EXPECT_NEAR(a.b, b.b, 0.01);
  }
}

TEST(ColourScale, SpansTheFiniteValues) {
  const ColourScale scale = scaleAcross({nan, 7, -2, infinity, 3, -infinity});
  EXPECT_EQ(scale.low, -2);
  EXPECT_EQ(scale.high, 7);
}

TEST(ColourScale, PutsASingleValueInTheMiddle) {
  const ColourScale scale = scaleAcross({5, 5});
  EXPECT_EQ(scale.low, 4.5);
  EXPECT_EQ(scale.high, 5.5);
}

TEST(ColourScale, NeedsNoValues) {
  for (const std::vector<float>& values : {std::vector<float>{}, std::vector<float>{nan}}) {
    EXPECT_EQ(scaleAcross(values).low, 0);
    EXPECT_EQ(scaleAcross(values).high, 1);
  }
}

}  // namespace
}  // namespace pelorin::cli
