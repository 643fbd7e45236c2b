#include "image_processing/filters/looks/cubic_radial_mask.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "image_processing/filters/looks/vignette_coordinates.h"

namespace pelorin::image_processing {
namespace {

constexpr float edge = 22.0f / 255.0f;
constexpr float centre = 163.0f / 255.0f;

TEST(CubicRadialMask, HasTheCentreValueAtZero) {
  EXPECT_EQ(edge, 0.08627451f);
  EXPECT_EQ(centre, 0.6392157f);
  EXPECT_FLOAT_EQ(CubicRadialMask(edge, centre, 400)(0.0f), centre);
  EXPECT_EQ(CubicRadialMask(0.0f, 1.0f, 400)(0.0f), 1.0f);
}

TEST(CubicRadialMask, HasTheEdgeValueAtOneAndBeyond) {
  const CubicRadialMask mask(edge, centre, 400);
  EXPECT_NEAR(mask(1.0f), edge, 1e-6f);
  for (const float q : {1.0001f, 2.0f, 1e30f, std::numeric_limits<float>::infinity()}) {
    EXPECT_EQ(mask(q), mask(1.0f)) << q;
  }
}

TEST(CubicRadialMask, TakesTheCentreForWhatIsNoDistance) {
  const CubicRadialMask mask(edge, centre, 400);
  EXPECT_EQ(mask(std::nanf("")), mask(0.0f));
  EXPECT_EQ(mask(-1.0f), mask(0.0f));
}

TEST(CubicRadialMask, FallsAllTheWayFromTheCentreToTheEdge) {
  const CubicRadialMask mask(edge, centre, 400);
  ASSERT_EQ(mask.samples().size(), 400u);
  for (std::size_t i = 1; i < 400; ++i) EXPECT_LT(mask.samples()[i], mask.samples()[i - 1]) << i;
}

TEST(CubicRadialMask, FollowsTheFittedCubicOfTheDistance) {
  const CubicRadialMask mask(0.0f, 1.0f, 400);
  for (const double r : {0.1, 0.25, 0.5, 0.75, 0.9}) {
    const double cubic = 1 - 0.49939314 * r - 1.5005553 * r * r + 0.99994844 * r * r * r;
    EXPECT_NEAR(mask.f(static_cast<float>(r * r)), cubic, 1e-6) << r;
  }
}

TEST(CubicRadialMask, LooksUpTheSampleTowardTheCentre) {
  const CubicRadialMask mask(edge, centre, 400);
  EXPECT_EQ(mask(0.99f / 399.0f), mask.samples()[0]);
  EXPECT_EQ(mask(1.01f / 399.0f), mask.samples()[1]);
  EXPECT_EQ(mask(200.5f / 399.0f), mask.samples()[200]);
}

TEST(CubicRadialMask, SamplesAtMultiplesOfAStepRoundedOnce) {
  const CubicRadialMask mask(edge, centre, 400);
  const float step = 1.0f / 399.0f;
  for (int i = 0; i < 400; ++i) {
    ASSERT_EQ(mask.samples()[i], mask.f(static_cast<float>(i) * step)) << i;
  }
}

TEST(VignetteCoordinates, StayWithinTheRadiusOnALandscapePhoto) {
  const VignetteCoordinates c(4000, 3000, 2.28f);
  EXPECT_NEAR(std::hypot(c.firstU, c.firstV), 0.73, 0.005);
}

TEST(VignetteCoordinates, AreZeroInTheMiddleWhateverTheAspect) {
  const VignetteCoordinates c(5, 3, 1.0f);
  EXPECT_FLOAT_EQ(c.step, 2.0f / 3.0f);
  EXPECT_FLOAT_EQ(c.firstU + 2.0f * c.step, 0.0f);
  EXPECT_FLOAT_EQ(c.firstV + c.step, 0.0f);
}

TEST(VignetteCoordinates, HaveNoStepForARadiusOfZero) {
  EXPECT_TRUE(std::isinf(VignetteCoordinates(5, 3, 0.0f).step));
  EXPECT_TRUE(std::isnan(VignetteCoordinates(5, 3, std::nanf("")).step));
}

}  // namespace
}  // namespace pelorin::image_processing
