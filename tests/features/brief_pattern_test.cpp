#include "image_processing/features/brief_pattern.h"

#include <gtest/gtest.h>

#include <cmath>
#include <set>
#include <tuple>

#include "tests/support/fingerprint.h"

namespace pelorin::image_processing {
namespace {

std::tuple<int, int, int, int> numbersOf(const BriefPair& pair) {
  return {pair.dy1, pair.dx1, pair.dy2, pair.dx2};
}

TEST(BriefPattern, HasTheGivenRows) {
  EXPECT_EQ(numbersOf(briefPattern[0]), std::tuple(-3, -9, -3, 4));
  EXPECT_EQ(numbersOf(briefPattern[1]), std::tuple(-3, 5, 9, -7));
  EXPECT_EQ(numbersOf(briefPattern[2]), std::tuple(2, -7, -3, 11));
  EXPECT_EQ(numbersOf(briefPattern[3]), std::tuple(-6, -11, -13, 4));
  EXPECT_EQ(numbersOf(briefPattern[255]), std::tuple(-2, -4, 12, -5));
}

TEST(BriefPattern, StaysWithinItsReach) {
  for (const BriefPair& pair : briefPattern) {
    for (const int step : {pair.dy1, pair.dx1, pair.dy2, pair.dx2}) {
      EXPECT_LE(std::abs(step), briefReach);
    }
  }
}

TEST(BriefPattern, SpreadsLikeAGaussianOfDeviation7AndMeanZero) {
  double sum = 0, squares = 0;
  for (const BriefPair& pair : briefPattern) {
    for (const int step : {pair.dy1, pair.dx1, pair.dy2, pair.dx2}) {
      sum += step;
      squares += step * step;
    }
  }
  const double mean = sum / 1024;
  EXPECT_NEAR(mean, 0.0, 0.25);
  EXPECT_NEAR(std::sqrt(squares / 1024 - mean * mean), 7.2, 0.1);
}

TEST(BriefPattern, ComparesDistinctPixelsAndNoPairTwice) {
  std::set<std::tuple<int, int, int, int>> seen;
  for (const BriefPair& pair : briefPattern) {
    EXPECT_FALSE(pair.dy1 == pair.dy2 && pair.dx1 == pair.dx2);
    EXPECT_TRUE(seen.insert(numbersOf(pair)).second);
  }
}

TEST(BriefPattern, IsFrozen) {
  EXPECT_EQ(test_support::fingerprint(briefPattern.data(), sizeof briefPattern),
            "6f2ae8ceabfb3c70");
}

}  // namespace
}  // namespace pelorin::image_processing
