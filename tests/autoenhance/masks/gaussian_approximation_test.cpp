#include "image_processing/autoenhance/masks/gaussian_approximation.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

namespace pelorin::image_processing {
namespace {

TEST(GaussianApproximation, IsPeakInTheMiddleAndBaselineFromTheEndsOn) {
  const GaussianApproximation<float> bell(-2.0f, 2.0f, 0.0f, 1.0f);
  EXPECT_EQ(bell(0.0f), 1.0f);
  EXPECT_NEAR(bell(1.0f), std::exp(-1.0f), 1e-6f);
  EXPECT_NEAR(bell(-1.0f), std::exp(-1.0f), 1e-6f);
  for (const float x : {2.0f, -2.0f, 7.0f, -1e30f, std::numeric_limits<float>::infinity()}) {
    EXPECT_EQ(bell(x), 0.0f) << x;
  }
  const GaussianApproximation<float> raised(0.0f, 10.0f, 2.0f, 5.0f);
  EXPECT_EQ(raised(5.0f), 5.0f);
  EXPECT_EQ(raised(-1.0f), 2.0f);
}

TEST(GaussianApproximation, StaysNearTheGaussianItStandsFor) {
  const GaussianApproximation<float> bell(-1.0f, 1.0f, 0.0f, 1.0f);
  for (float t = -1.0f; t <= 1.0f; t += 0.01f) EXPECT_NEAR(bell(t), std::exp(-4 * t * t), 0.03f);
}

TEST(GaussianApproximation, WeighsNothingOverAnEmptySupport) {
  const GaussianApproximation<float> bell(-0.0f, 0.0f, 0.0f, 1.0f);
  EXPECT_EQ(bell(0.0f), 0.0f);
  EXPECT_EQ(bell(0.5f), 0.0f);
  EXPECT_EQ(bell(std::nanf("")), 0.0f);
}

}  // namespace
}  // namespace pelorin::image_processing
