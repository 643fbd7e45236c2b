#include "image_processing/core/sampled_curve.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <vector>

namespace pelorin::image_processing {
namespace {

TEST(ApplyToneCurve, ReturnsTheFirstSampleAtZeroAndTheLastAtTheTop) {
  const std::vector<float> curve = {3.0f, 5.0f, 11.0f};
  EXPECT_EQ(applyToneCurve(0.0f, curve, 2, 0.5f), 3.0f);
  EXPECT_EQ(applyToneCurve(4.0f, curve, 2, 0.5f), 11.0f);
}

TEST(ApplyToneCurve, InterpolatesBetweenSamples) {
  const std::vector<float> curve = {3.0f, 5.0f, 11.0f};
  EXPECT_EQ(applyToneCurve(1.0f, curve, 2, 0.5f), 4.0f);
  EXPECT_EQ(applyToneCurve(3.0f, curve, 2, 0.5f), 8.0f);
}

TEST(ApplyToneCurve, ReadsNoSampleOutsideItself) {
  const std::vector<float> curve = {3.0f, 5.0f, 11.0f};  // a sanitizer watches the ends
  EXPECT_NEAR(applyToneCurve(1e9f, curve, 2, 0.5f), 11.0f, 1e-5f);
  EXPECT_NEAR(applyToneCurve(-77.5f, curve, 2, 0.5f), 3.0f, 1e-5f);
  EXPECT_EQ(applyToneCurve(-1.0f, curve, 2, 0.5f), 2.0f);  // half a sample below 0
  EXPECT_TRUE(std::isnan(applyToneCurve(std::nanf(""), curve, 2, 0.5f)));
  for (const float x : {std::numeric_limits<float>::infinity(), 3.4e38f, -3.4e38f}) {
    static_cast<void>(applyToneCurve(x, curve, 2, 0.5f));
    static_cast<void>(applyToneCurve(-x, curve, 2, 0.5f));
  }
}

}  // namespace
}  // namespace pelorin::image_processing
