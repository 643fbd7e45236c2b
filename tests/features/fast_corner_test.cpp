#include "image_processing/features/fast_corner.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <climits>

#include "tests/features/brute_force.h"

namespace pelorin::image_processing {
namespace {

using test_support::Random;

constexpr std::array<int, 4> arcs = {9, 10, 11, 12};

TEST(FastCircle, HoldsThePixelsAtDistanceThreeEachNextToTheOneBefore) {
  std::vector<xy> expected = test_support::circleByGeometry();
  ASSERT_EQ(expected.size(), 16u);
  // Both go round; ours starts below the centre, at an angle of a quarter, and the other way.
  std::reverse(expected.begin(), expected.end());
  std::rotate(expected.begin(), std::find(expected.begin(), expected.end(), xy{0, 3}),
              expected.end());
  EXPECT_TRUE(std::equal(fastCircle.begin(), fastCircle.end(), expected.begin()));
}

// A circle whose first `length` pixels from `start` on are `value`, the others `rest`.
CircleValues circleWithArc(int start, int length, std::uint8_t value, std::uint8_t rest) {
  CircleValues circle;
  circle.fill(rest);
  for (int i = 0; i < length; ++i) circle[(start + i) % 16] = value;
  return circle;
}

TEST(IsCorner, NeedsTheWholeArcWhereverItStarts) {
  for (const int arc : arcs) {
    for (int start = 0; start < 16; ++start) {
      EXPECT_TRUE(isCorner(100, circleWithArc(start, arc, 121, 100), arc, 20));
      EXPECT_TRUE(isCorner(100, circleWithArc(start, arc, 79, 100), arc, 20));
      EXPECT_FALSE(isCorner(100, circleWithArc(start, arc - 1, 121, 100), arc, 20));
      EXPECT_FALSE(isCorner(100, circleWithArc(start, arc - 1, 79, 100), arc, 20));
    }
  }
}

TEST(IsCorner, ComparesStrictly) {
  EXPECT_FALSE(isCorner(100, circleWithArc(0, 16, 120, 0), 9, 20));
  EXPECT_TRUE(isCorner(100, circleWithArc(0, 16, 121, 0), 9, 20));
  EXPECT_FALSE(isCorner(100, circleWithArc(0, 16, 80, 0), 9, 20));
  EXPECT_TRUE(isCorner(100, circleWithArc(0, 16, 79, 0), 9, 20));
}

TEST(IsCorner, DoesNotMixBrighterAndDarker) {
  CircleValues circle = circleWithArc(0, 8, 255, 0);
  EXPECT_FALSE(isCorner(128, circle, 9, 20));
}

TEST(IsCorner, TakesAnyThreshold) {
  const CircleValues different = circleWithArc(0, 16, 255, 255);
  const CircleValues alike = circleWithArc(0, 16, 0, 0);
  EXPECT_TRUE(isCorner(0, different, 9, 254));
  EXPECT_FALSE(isCorner(0, different, 9, 255));
  EXPECT_FALSE(isCorner(0, different, 9, INT_MAX));
  EXPECT_FALSE(isCorner(0, alike, 9, 0));
  EXPECT_TRUE(isCorner(0, alike, 9, -1));
  EXPECT_TRUE(isCorner(0, different, 9, INT_MIN));
}

TEST(CornerScore, EqualsTheBisectionForEveryCircleAndThreshold) {
  Random random(7);
  for (int round = 0; round < 4000; ++round) {
    const std::uint32_t range = 1 + random.below(256);  // from flat to full contrast
    const auto value = [&] {
      return static_cast<std::uint8_t>(random.below(range) + (256 - range) / 2);
    };
    CircleValues circle;
    std::generate(circle.begin(), circle.end(), value);
    const std::uint8_t centre = value();
    for (const int arc : arcs) {
      for (const int b : {INT_MIN, -1000, -256, -20, -1, 0, 20, 254, 255, 256, 300, INT_MAX}) {
        ASSERT_EQ(cornerScore(centre, circle, arc, b), cornerScoreScalar(centre, circle, arc, b))
            << arc << " of 16 at " << b;
      }
    }
  }
}

}  // namespace
}  // namespace pelorin::image_processing
