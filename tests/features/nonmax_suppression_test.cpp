#include <gtest/gtest.h>

#include <algorithm>
#include <climits>

#include "image_processing/features/fast.h"
#include "tests/features/brute_force.h"
#include "tests/features/fast_variants.h"

namespace pelorin::test_support {
namespace {

using Corners = std::vector<xy>;

TEST(NonmaxSuppression, DropsBothOfTwoNeighboursWithTheSameScore) {
  EXPECT_EQ(suppress({{5, 5}, {6, 5}}, {30, 30}), Corners{});
  EXPECT_EQ(suppress({{5, 5}, {5, 6}}, {30, 30}), Corners{});
  EXPECT_EQ(suppress({{5, 5}, {6, 6}}, {30, 30}), Corners{});
  EXPECT_EQ(suppress({{6, 5}, {5, 6}}, {30, 30}), Corners{});
}

TEST(NonmaxSuppression, KeepsTheHigherOfTwoNeighbours) {
  EXPECT_EQ(suppress({{5, 5}, {6, 5}}, {30, 31}), (Corners{{6, 5}}));
  EXPECT_EQ(suppress({{5, 5}, {4, 6}}, {31, 30}), (Corners{{5, 5}}));
}

TEST(NonmaxSuppression, KeepsCornersThatAreNoNeighbours) {
  const Corners apart = {{5, 5}, {7, 5}, {3, 7}, {5, 7}, {9, 10}};
  EXPECT_EQ(suppress(apart, {30, 30, 30, 30, 30}), apart);
}

TEST(NonmaxSuppression, DropsACornerThatOnlyADroppedOneBeats) {
  EXPECT_EQ(suppress({{5, 5}, {6, 5}, {7, 5}}, {30, 31, 32}), (Corners{{7, 5}}));
}

TEST(NonmaxSuppression, DoesNotWrapFromOneRowToTheNext) {
  const Corners corners = {{9, 5}, {10, 6}, {0, 9}, {INT_MAX, 20}, {INT_MIN, 21}};
  EXPECT_EQ(suppress(corners, {1, 2, 9, 7, 7}),
            (Corners{{10, 6}, {0, 9}, {INT_MAX, 20}, {INT_MIN, 21}}));
}

TEST(NonmaxSuppression, GivesNullForNoCorners) {
  const xy corner = {5, 5};
  const int score = 30;
  for (const int count : {0, -1, INT_MIN}) {
    int kept = -1;
    EXPECT_EQ(nonmax_suppression(&corner, &score, count, &kept), nullptr);
    EXPECT_EQ(kept, 0);
  }
  int kept = -1;
  EXPECT_EQ(nonmax_suppression(nullptr, &score, 1, &kept), nullptr);
  EXPECT_EQ(kept, 0);
  kept = -1;
  EXPECT_EQ(nonmax_suppression(&corner, nullptr, 1, &kept), nullptr);
  EXPECT_EQ(kept, 0);
}

TEST(NonmaxSuppression, GivesNullForCornersInAnotherOrder) {
  for (const Corners& unsorted : {Corners{{6, 5}, {5, 5}}, Corners{{5, 6}, {5, 5}},
                                  Corners{{1, 1}, {2, 1}, {9, 0}, {1, 2}}}) {
    const std::vector<int> scores(unsorted.size(), 30);
    int kept = -1;
    EXPECT_EQ(nonmax_suppression(unsorted.data(), scores.data(), static_cast<int>(unsorted.size()),
                                 &kept),
              nullptr);
    EXPECT_EQ(kept, 0);
  }
}

TEST(NonmaxSuppression, TakesNegativeAndExtremePositions) {
  const Corners corners = {{INT_MIN, INT_MIN}, {-4, -9}, {-3, -9}, {-1, -8}, {INT_MAX, INT_MAX}};
  EXPECT_EQ(suppress(corners, {1, 5, 4, 3, 1}),
            (Corners{{INT_MIN, INT_MIN}, {-4, -9}, {-1, -8}, {INT_MAX, INT_MAX}}));
}

TEST(NonmaxSuppression, EqualsBruteForceOnCrowdedCornersWithTies) {
  for (std::uint64_t seed = 0; seed < 300; ++seed) {
    Random random(seed);
    const std::uint32_t density = 1 + random.below(10), levels = 1 + random.below(6);
    Corners corners;
    std::vector<int> scores;
    for (int y = -5; y < 8; ++y) {
      for (int x = -5; x < 12; ++x) {
        if (random.below(10) >= density) continue;
        corners.push_back({x, y});
        scores.push_back(static_cast<int>(random.below(levels)) - 2);
      }
    }
    ASSERT_EQ(suppress(corners, scores), maximaByBruteForce(corners, scores)) << seed;
  }
}

}  // namespace
}  // namespace pelorin::test_support
