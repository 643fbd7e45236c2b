#include <gtest/gtest.h>

#include <algorithm>

#include "image_processing/dupe/dupe_score.h"
#include "tests/photo/collection/pair_samples.h"
#include "tests/support/pictures.h"

namespace pelorin::photo {
namespace {

using test_support::PairSamples;

const std::vector<PairSamples>& samples() {
  static const std::vector<PairSamples> all = [] {
    std::vector<test_support::Picture> scenes;
    for (std::uint64_t seed = 0; seed < 10; ++seed) {
      scenes.push_back(test_support::photoLikePicture(320, 240, seed));
    }
    return test_support::pairSamples(scenes);
  }();
  return all;
}

// The share of pairs for which `holds`, of all kinds whose names begin so.
template <typename Predicate>
double share(const std::string& name, Predicate holds) {
  std::size_t held = 0, all = 0;
  for (const PairSamples& kind : samples()) {
    if (!kind.name.starts_with(name)) continue;
    held += static_cast<std::size_t>(std::count_if(kind.pairs.begin(), kind.pairs.end(), holds));
    all += kind.pairs.size();
  }
  EXPECT_GT(all, 0u) << name;
  return static_cast<double>(held) / static_cast<double>(all);
}

bool isDupe(const ShotPair& pair) {
  return pair.score >= leastDupeScore;
}

bool looksAlike(const ShotPair& pair) {
  return image_processing::dupeScoreOfDistance(pair.distance, 0, pair.sameOrientation) >=
         leastLookAlikeScore;
}

TEST(LeastDupeScore, IsReachedByCopiesAndByShotsWithinASecond) {
  for (const char* name :
       {"saved again", "half as wide", "crop, 90", "turned", "enhanced", "burst, 0.3 s"}) {
    EXPECT_EQ(share(name, isDupe), 1.0) << name;
  }
  EXPECT_GE(share("burst, 1 s", isDupe), 0.8);
  EXPECT_GE(share("crop, 70", isDupe), 0.8);
}

TEST(LeastDupeScore, IsReachedByFewUnrelatedPicturesSecondsApart) {
  EXPECT_LE(share("unrelated, 3 s", isDupe), 0.1);
  EXPECT_LE(share("the left", isDupe), 0.2);
  EXPECT_EQ(share("unrelated, 10 s", isDupe), 0.0);
}

TEST(LeastLookAlikeScore, IsReachedByCopiesAndLittleElseWhateverTheTime) {
  EXPECT_EQ(share("saved again", looksAlike), 1.0);
  EXPECT_EQ(share("half as wide", looksAlike), 1.0);
  EXPECT_LE(share("unrelated, 3 s", looksAlike), 0.03);
  EXPECT_LE(share("the left", looksAlike), 0.1);
}

}  // namespace
}  // namespace pelorin::photo
