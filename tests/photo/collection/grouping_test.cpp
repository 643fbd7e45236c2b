#include "photo/collection/grouping.h"

#include <gtest/gtest.h>

namespace pelorin::photo {
namespace {

ShotPair pairOf(std::size_t first, std::size_t second) {
  ShotPair pair{};
  pair.first = first;
  pair.second = second;
  return pair;
}

TEST(WholeGroups, LeaveOutPhotosWithoutAPair) {
  EXPECT_TRUE(groupWholly(5, {}).empty());
  EXPECT_TRUE(groupWholly(0, {}).empty());
}

TEST(WholeGroups, StandInTheOrderOfTheirFirstPhotos) {
  const std::vector<DupeGroup> groups = groupWholly(6, {pairOf(3, 4), pairOf(1, 5), pairOf(0, 2)});
  ASSERT_EQ(groups.size(), 3u);
  EXPECT_EQ(groups[0].photos.front(), 0u);
  EXPECT_EQ(groups[1].photos.front(), 1u);
  EXPECT_EQ(groups[2].photos.front(), 3u);
}

// A and B, B and C alike, A and C not: no group may say that one stands for the other.
TEST(WholeGroups, NeverJoinWhatIsNoPair) {
  std::vector<ShotPair> pairs = {pairOf(0, 1), pairOf(1, 2), pairOf(3, 4), pairOf(3, 5),
                                 pairOf(4, 5)};
  pairs[0].score = 1.0f;
  pairs[1].score = 2.0f;
  const std::vector<DupeGroup> groups = groupWholly(7, pairs);
  ASSERT_EQ(groups.size(), 2u);
  EXPECT_EQ(groups[0].photos, (std::vector<std::size_t>{1, 2}));
  EXPECT_EQ(groups[0].pairs, std::vector<ShotPair>{pairs[1]});
  EXPECT_EQ(groups[1].photos, (std::vector<std::size_t>{3, 4, 5}));
  EXPECT_EQ(groups[1].pairs.size(), 3u);
}

TEST(WholeGroups, TakeALongChainApart) {
  std::vector<ShotPair> pairs;
  for (std::size_t i = 1; i < 100'000; ++i) pairs.push_back(pairOf(i - 1, i));
  const std::vector<DupeGroup> groups = groupWholly(100'000, pairs);
  EXPECT_EQ(groups.size(), 50'000u);
  for (const DupeGroup& group : groups) ASSERT_EQ(group.photos.size(), 2u);
}

TEST(WholeGroups, TakeABurstWhole) {
  std::vector<ShotPair> pairs;
  for (std::size_t a = 0; a < 300; ++a) {
    for (std::size_t b = a + 1; b < 300; ++b) pairs.push_back(pairOf(a, b));
  }
  const std::vector<DupeGroup> groups = groupWholly(300, pairs);
  ASSERT_EQ(groups.size(), 1u);
  EXPECT_EQ(groups[0].photos.size(), 300u);
  EXPECT_EQ(groups[0].pairs.size(), pairs.size());
}

}  // namespace
}  // namespace pelorin::photo
