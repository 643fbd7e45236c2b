#include "image_processing/autoenhance/lightness/tone_curve.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <vector>

#include "image_processing/autoenhance/lightness/cdf.h"
#include "tests/support/curves.h"

namespace pelorin::image_processing {
namespace {

using test_support::darkCurve;

TEST(UpdateCurveForFaces, ChangesNothingWithoutAFaceOrATarget) {
  const std::vector<float> before = darkCurve();
  std::vector<float> curve = before;
  updateCurveForFaces(0.5f, -1, curve);
  updateCurveForFaces(0.0f, 20, curve);
  updateCurveForFaces(-1.0f, 20, curve);
  updateCurveForFaces(std::nanf(""), 20, curve);
  updateCurveForFaces(0.5f, 50, curve);  // no bin of the curve
  EXPECT_EQ(curve, before);
}

TEST(UpdateCurveForFaces, ChangesNothingWhenTheTargetIsMet) {
  const std::vector<float> before = darkCurve();
  std::vector<float> curve = before;
  updateCurveForFaces(0.15f, 20, curve);  // (20/50)² = 0.16
  EXPECT_EQ(curve, before);
}

TEST(UpdateCurveForFaces, LiftsTheFaceMedianTowardTheTargetAndKeepsTheMass) {
  std::vector<float> curve = darkCurve();
  updateCurveForFaces(0.15f, 10, curve);  // (10/50)² = 0.04
  EXPECT_GT(curve[10], 0.13f);
  EXPECT_NEAR(curve[50], 1.0f, 1e-5f);
  for (int i = 1; i < 51; ++i) EXPECT_GE(curve[i], curve[i - 1]);
}

/// The lift in so many rounds, whether the target is met or not.
std::vector<float> liftedInRounds(int rounds, float target, int faceBin, std::vector<float> curve) {
  std::vector<float> histogram;
  computeHistogramFromCDF(curve, histogram);
  const int bins = static_cast<int>(histogram.size());
  for (int round = 0; round < rounds; ++round) {
    const float share = (target - curve[faceBin]) / static_cast<float>(bins - faceBin - 1);
    float collected = 0.0f;
    for (int bin = faceBin + 1; bin < bins; ++bin) {
      const float take = std::min(share, histogram[bin]);
      histogram[bin] -= take;
      collected += take;
    }
    for (int bin = 0; bin <= faceBin; ++bin) {
      histogram[bin] += collected / static_cast<float>(faceBin + 1);
    }
    computeCDF(histogram, curve);
  }
  return curve;
}

TEST(UpdateCurveForFaces, GivesUpAfterTenRounds) {
  // Each round makes up for half of what is missing at bin 1, since bin 1 itself lies above it.
  std::vector<float> curve = darkCurve();
  const std::vector<float> before = curve;
  updateCurveForFaces(0.15f, 1, curve);
  EXPECT_LT(curve[1], 0.15f);
  EXPECT_EQ(curve, liftedInRounds(10, 0.15f, 1, before));
  EXPECT_NE(curve, liftedInRounds(9, 0.15f, 1, before));
  EXPECT_NE(curve, liftedInRounds(11, 0.15f, 1, before));
}

TEST(UpdateCurveForFaces, MovesNothingWhenTheFaceIsInTheLastBin) {
  std::vector<float> curve = darkCurve(), histogram, summedAgain;
  // Sums begin at 0 and this does not: that the rounds are gone through can be seen.
  for (float& y : curve) y = 0.05f + 0.1f * y;
  computeHistogramFromCDF(curve, histogram);
  computeCDF(histogram, summedAgain);
  EXPECT_NE(summedAgain, curve);
  updateCurveForFaces(0.2f, 49, curve);
  EXPECT_EQ(curve, summedAgain);
}

TEST(CurveMassage, HoldsTheSlopeNearItsBounds) {
  std::vector<float> curve(51, 1.0f);  // all mass in the first bin
  curve[0] = 0.0f;
  curveMassage(curve, 0.75f, 8.0f, 20);
  std::vector<float> histogram;
  computeHistogramFromCDF(curve, histogram);
  EXPECT_NEAR(curve[50], 1.0f, 1e-5f);
  for (const float share : histogram) {
    EXPECT_GT(share, 0.7f / 50);
    EXPECT_LT(share, 8.1f / 50);
  }
}

TEST(CurveMassage, GivesTheSharesWorkedOutByHand) {
  // Shares 1/2, 1/4, 1/4 and 0 of four bins; none may be below 3/16.
  std::vector<float> curve = {0.0f, 0.5f, 0.75f, 1.0f, 1.0f};
  std::vector<float> twice = curve;
  curveMassage(curve, 0.75f, 8.0f, 1);
  const double sum = 19.0 / 16;
  const double once[] = {0.0, 0.5 / sum, 0.75 / sum, 1.0 / sum, 1.0};
  for (int i = 0; i < 5; ++i) EXPECT_NEAR(curve[i], once[i], 1e-6) << i;
  curveMassage(twice, 0.75f, 8.0f, 2);
  const double sumAgain = 16.0 / 19 + 3.0 / 16;
  for (int i = 0; i < 4; ++i) EXPECT_NEAR(twice[i], once[i] / sumAgain, 1e-6) << i;
  EXPECT_NEAR(twice[4], 1.0, 1e-6);
}

TEST(CurveMassage, KeepsTheClampedHistogramFromRoundToRound) {
  const std::vector<float> before = darkCurve();
  constexpr int rounds = 20;
  const float low = 0.75f / 50.0f, high = 8.0f / 50.0f;
  std::vector<float> kept, taken, expected, fromCurve = before;
  computeHistogramFromCDF(before, kept);
  const auto clampAndNormalise = [&](std::vector<float>& histogram) {
    double sum = 0.0;
    for (float& share : histogram) {
      share = std::min(std::max(share, low), high);
      sum += static_cast<double>(share);
    }
    const double normaliser = 1.0 / sum;
    for (float& share : histogram) share = static_cast<float>(share * normaliser);
  };
  for (int round = 0; round < rounds; ++round) {
    clampAndNormalise(kept);
    // What it would be if each round began with the curve of the last one.
    computeHistogramFromCDF(fromCurve, taken);
    clampAndNormalise(taken);
    computeCDF(taken, fromCurve);
  }
  computeCDF(kept, expected);
  std::vector<float> curve = before;
  curveMassage(curve, 0.75f, 8.0f, rounds);
  EXPECT_EQ(curve, expected);
  EXPECT_NE(curve, fromCurve) << "the test could not tell the difference";
}

TEST(CurveMassage, GivesDefinedNumbersForNaN) {
  std::vector<float> curve(51, std::nanf(""));
  curveMassage(curve, 0.75f, 8.0f, 20);
  EXPECT_EQ(curve[0], 0.0f);
  EXPECT_TRUE(std::isnan(curve[50]));
}

}  // namespace
}  // namespace pelorin::image_processing
