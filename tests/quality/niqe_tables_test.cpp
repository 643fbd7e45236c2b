#include "image_processing/quality/niqe_tables.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <vector>

namespace pelorin::image_processing {
namespace {

// The closed forms at alpha = 0.1, 0.2 ... 11.0, in double.
constexpr int samples = 110;

double sampledShape(int i) {
  return 0.1 * (i + 1);
}

double ratioOf(double shape) {
  return std::exp(2.0 * std::lgamma(2.0 / shape) - std::lgamma(1.0 / shape) -
                  std::lgamma(3.0 / shape));
}

template <typename ClosedForm>
std::vector<double> sampled(const ClosedForm& closedForm) {
  std::vector<double> values;
  for (int i = 0; i < samples; ++i) values.push_back(closedForm(sampledShape(i)));
  return values;
}

std::vector<double> resampledLinearly(const std::vector<double>& values, int entries) {
  std::vector<double> result;
  for (int k = 0; k < entries; ++k) {
    const double position = static_cast<double>(k) * (samples - 1) / (entries - 1);
    const int i = std::min(static_cast<int>(position), samples - 2);
    const double t = position - i;
    result.push_back((1.0 - t) * values[i] + t * values[i + 1]);
  }
  return result;
}

// Slope of a monotone cubic at its first point; the last mirrors it.
double endSlope(double step, double nextStep, double secant, double nextSecant) {
  const double slope = ((2.0 * step + nextStep) * secant - step * nextSecant) / (step + nextStep);
  return slope * secant <= 0.0 ? 0.0 : slope;  // both secants rise here
}

// Monotone cubic interpolation of a rising sequence after Fritsch and Carlson.
std::vector<double> resampledMonotone(const std::vector<double>& x, const std::vector<double>& y,
                                      int entries) {
  const int last = static_cast<int>(x.size()) - 1;
  std::vector<double> step, secant, slope(x.size());
  for (int i = 0; i < last; ++i) {
    step.push_back(x[i + 1] - x[i]);
    secant.push_back((y[i + 1] - y[i]) / step[i]);
  }
  for (int i = 1; i < last; ++i) {
    const double before = 2.0 * step[i] + step[i - 1], after = step[i] + 2.0 * step[i - 1];
    slope[i] = (before + after) / (before / secant[i - 1] + after / secant[i]);
  }
  slope[0] = endSlope(step[0], step[1], secant[0], secant[1]);
  slope[last] = endSlope(step[last - 1], step[last - 2], secant[last - 1], secant[last - 2]);

  std::vector<double> result;
  for (int k = 0, i = 0; k < entries; ++k) {
    const double at = x[0] + k * (x[last] - x[0]) / (entries - 1);
    while (i < last - 1 && at >= x[i + 1]) ++i;
    const double t = (at - x[i]) / step[i], u = 1.0 - t;
    result.push_back((1.0 + 2.0 * t) * u * u * y[i] + t * u * u * step[i] * slope[i] +
                     t * t * (3.0 - 2.0 * t) * y[i + 1] - t * t * u * step[i] * slope[i + 1]);
  }
  return result;
}

template <std::size_t Entries>
void expectEveryBit(const std::array<float, Entries>& table, const std::vector<double>& rule) {
  ASSERT_EQ(rule.size(), Entries);
  for (std::size_t k = 0; k < Entries; ++k)
    EXPECT_EQ(table[k], static_cast<float>(rule[k])) << "entry " << k;
}

TEST(NiqeTables, ScaleFactorsFollowTheirRuleToTheBit) {
  auto rule = resampledLinearly(
      sampled([](double shape) {
        return std::exp(0.5 * (std::lgamma(1.0 / shape) - std::lgamma(3.0 / shape)));
      }),
      150);
  rule[0] = 0.0;
  expectEveryBit(scaleFactorTable, rule);
}

TEST(NiqeTables, MeanFactorsFollowTheirRuleToTheBit) {
  expectEveryBit(meanFactorTable,
                 resampledLinearly(sampled([](double shape) {
                                     return (std::lgamma(2.0 / shape) - std::lgamma(1.0 / shape)) /
                                            std::log(10.0);
                                   }),
                                   150));
}

TEST(NiqeTables, ShapesFollowTheirRuleToTheBit) {
  expectEveryBit(shapeFromRatioTable,
                 resampledMonotone(sampled(ratioOf), sampled([](double s) { return s; }), 50));
}

TEST(NiqeTables, DomainIsThatOfTheClosedForm) {
  EXPECT_FLOAT_EQ(smallestRatio, static_cast<float>(ratioOf(0.1)));
  EXPECT_FLOAT_EQ(largestRatio, static_cast<float>(ratioOf(11.0)));
  EXPECT_FLOAT_EQ(ratioRange, static_cast<float>(ratioOf(11.0) - ratioOf(0.1)));
}

TEST(NiqeTables, HoldTheEntriesKnownFromElsewhere) {
  EXPECT_EQ(shapeFromRatioTable[0], 0.1f);
  EXPECT_EQ(shapeFromRatioTable[1], 0.12861364f);
  EXPECT_EQ(shapeFromRatioTable[2], 0.15562604f);
  EXPECT_EQ(shapeFromRatioTable[3], 0.18047026f);
  EXPECT_EQ(shapeFromRatioTable[25], 0.65080941f);
  EXPECT_EQ(shapeFromRatioTable[48], 5.9262967f);
  EXPECT_EQ(shapeFromRatioTable[49], 11.0f);
  EXPECT_EQ(scaleFactorTable[0], 0.0f);
  EXPECT_EQ(scaleFactorTable[1], 1.2137847e-05f);
  EXPECT_EQ(scaleFactorTable[2], 0.0012902351f);
  EXPECT_EQ(scaleFactorTable[3], 0.0074159573f);
  EXPECT_EQ(scaleFactorTable[10], 0.49405846f);
  EXPECT_EQ(scaleFactorTable[149], 1.7822794f);
  EXPECT_FLOAT_EQ(meanFactorTable[0], 11.525331f);
  EXPECT_EQ(meanFactorTable[1], 6.1515732f);
  EXPECT_EQ(meanFactorTable[2], 3.2379472f);
  EXPECT_EQ(meanFactorTable[3], 1.9730769f);
  EXPECT_EQ(meanFactorTable[10], 0.13627571f);
  EXPECT_EQ(meanFactorTable[149], -0.31577307f);
}

TEST(NiqeTables, LookUpsReachBothEnds) {
  EXPECT_EQ(shapeFromRatio(smallestRatio), 0.1f);
  EXPECT_NEAR(shapeFromRatio(largestRatio), 11.0f, 1e-4f);
  EXPECT_EQ(scaleFactor(smallestShape), 0.0f);
  EXPECT_NEAR(scaleFactor(largestShape), 1.7822794f, 1e-6f);
  EXPECT_NEAR(meanFactor(largestShape), -0.31577307f, 1e-6f);
  EXPECT_TRUE(isTabulatedShape(smallestShape));
  EXPECT_TRUE(isTabulatedShape(largestShape));
  EXPECT_FALSE(isTabulatedShape(0.0999f));
  EXPECT_FALSE(isTabulatedShape(11.001f));
  EXPECT_FALSE(isTabulatedShape(NAN));
}

}  // namespace
}  // namespace pelorin::image_processing
