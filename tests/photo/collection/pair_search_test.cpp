#include "photo/collection/pair_search.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <limits>

#include "image_processing/dupe/dupe_score.h"
#include "tests/dupe/synthetic_cdfs.h"
#include "tests/photo/collection/synthetic_shots.h"
#include "tests/support/slow_build.h"

namespace pelorin::photo {
namespace {

using test_support::LibraryKind;
using test_support::slowBuild;
using test_support::syntheticShots;

// Every pair, without any thought of time windows. Rounding is monotone, so a pair that fails at
// distance 0 fails at any: with `skipHopeless` those distances are not computed.
std::vector<ShotPair> allPairs(const std::vector<Shot>& shots, float threshold,
                               bool skipHopeless = false) {
  std::vector<ShotPair> pairs;
  for (std::size_t first = 0; first < shots.size(); ++first) {
    for (std::size_t second = first + 1; second < shots.size(); ++second) {
      const Shot &a = shots[first], &b = shots[second];
      if (skipHopeless && a.time && b.time) {
        const float seconds = static_cast<float>(secondsBetween(*a.time, *b.time));
        const bool same = a.orientation == b.orientation;
        if (image_processing::dupeScoreOfDistance(0.0f, seconds, same) < threshold) continue;
      }
      ShotPair pair = compareShots(a, b);
      pair.first = first;
      pair.second = second;
      if (pair.score >= threshold) pairs.push_back(pair);
    }
  }
  return pairs;
}

Shot shotAt(double wallClock, std::optional<double> utc) {
  return {test_support::syntheticCDF(1), 1, ShotTime{wallClock, utc}};
}

TEST(PairSearch, FindsWhatComparingAllOfThousandsFinds) {
  constexpr std::uint32_t count = slowBuild ? 500 : 2500;
  const std::vector<Shot> shots = syntheticShots(count, {.withoutTime = 10, .withoutZone = 200}, 1);
  const std::vector<ShotPair> pairs = findPairs(shots, 0.0f);
  EXPECT_GT(pairs.size(), count * 3 / 5);
  EXPECT_EQ(pairs, allPairs(shots, 0.0f, /*skipHopeless=*/true));
}

TEST(PairSearch, FindsWhatComparingAllFindsWhateverTheLibrary) {
  std::uint64_t seed = 2;
  for (const std::uint32_t withoutTime : {0u, 500u, 1000u}) {
    for (const std::uint32_t withoutZone : {0u, 500u, 1000u}) {
      for (const double pause : {0.0, 3.0, 4000.0}) {
        for (const float threshold : {-4.0f, 0.0f, 2.0f, 3.6f, 4.0f}) {
          if (++seed % 4 != 0 && slowBuild) continue;
          const std::vector<Shot> shots =
              syntheticShots(60, {pause, withoutTime, withoutZone, 300}, seed);
          ASSERT_EQ(findPairs(shots, threshold), allPairs(shots, threshold))
              << withoutTime << ' ' << withoutZone << ' ' << pause << ' ' << threshold;
        }
      }
    }
  }
}

TEST(PairSearch, TakesAnyThreshold) {
  constexpr float infinity = std::numeric_limits<float>::infinity();
  const std::vector<Shot> shots = syntheticShots(40, {.withoutTime = 200}, 3);
  EXPECT_EQ(findPairs(shots, -infinity).size(), 40u * 39 / 2);
  EXPECT_EQ(findPairs(shots, -1e30f).size(), 40u * 39 / 2);
  EXPECT_TRUE(findPairs(shots, infinity).empty());
}

TEST(PairSearch, OfNoneOrOneShotFindsNothing) {
  EXPECT_TRUE(findPairs({}, 0.0f).empty());
  EXPECT_TRUE(findPairs(syntheticShots(1, {}, 1), -100.0f).empty());
}

TEST(PairSearch, TakesNoTimeBetweenShotsWithoutOneAndSaysSo) {
  const Shot timed = shotAt(5e8, 5e8);
  Shot untimed = timed;
  untimed.time.reset();
  for (const std::vector<Shot>& shots : {std::vector{timed, untimed}, {untimed, timed}}) {
    const std::vector<ShotPair> pairs = findPairs(shots, 0.0f);
    ASSERT_EQ(pairs.size(), 1u);
    EXPECT_FALSE(pairs[0].timesKnown);
    EXPECT_EQ(pairs[0].seconds, 0.0);
    EXPECT_EQ(pairs[0].score, image_processing::dupeScoreOfDistance(pairs[0].distance, 0, true));
  }
}

TEST(PairSearch, ComparesUTCWhereBothOffsetsAreKnown) {
  // Two cameras set to different time zones.
  EXPECT_EQ(findPairs(std::vector{shotAt(7200, 0), shotAt(3600, 1)}, 0.0f).size(), 1u);
  EXPECT_EQ(findPairs(std::vector{shotAt(7200, 0), shotAt(7200, 3600)}, 0.0f).size(), 0u);
}

TEST(PairSearch, ComparesWallClocksWhereAnOffsetIsNotKnown) {
  const Shot zoned = shotAt(7200, 0), other = shotAt(7201, std::nullopt);
  for (const std::vector<Shot>& shots : {std::vector{zoned, other}, {other, zoned}}) {
    const std::vector<ShotPair> pairs = findPairs(shots, 0.0f);
    ASSERT_EQ(pairs.size(), 1u);
    EXPECT_EQ(pairs[0].seconds, 1.0);
    EXPECT_TRUE(pairs[0].timesKnown);
  }
}

TEST(PairSearch, FindsEachPairInOneStepInAnyOrderOfSteps) {
  const std::vector<Shot> shots = syntheticShots(300, {20.0, 50, 300, 100}, 9);
  const PairSearch search(shots, 0.0f);
  PreparedShots prepared(shots);
  std::vector<ShotPair> pairs;
  for (std::size_t step = search.stepCount(); step-- > 0;) search.run(step, prepared, pairs);
  sortPairs(pairs);
  EXPECT_EQ(std::adjacent_find(pairs.begin(), pairs.end()), pairs.end());
  EXPECT_EQ(pairs, findPairs(shots, 0.0f));
}

TEST(PairSearch, ComparesOnlyWhatIsNearInTime) {
  // A run over all pairs of so many shots would take hours.
  std::vector<Shot> shots(300'000, shotAt(0, 0));
  for (std::size_t i = 0; i < shots.size(); ++i) {
    shots[i].time = ShotTime{1000.0 * i, 1000.0 * i};
  }
  shots[7].time = ShotTime{1000.0 * 8 + 1, 1000.0 * 8 + 1};
  EXPECT_EQ(findPairs(shots, 0.0f).size(), 1u);
}

}  // namespace
}  // namespace pelorin::photo
