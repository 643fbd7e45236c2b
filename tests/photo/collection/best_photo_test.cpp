#include "photo/collection/best_photo.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <limits>

#include "photo/collection/photo_score.h"

namespace pelorin::photo {
namespace {

using testing::HasSubstr;

ScannedPhoto photoOf(std::uint32_t width, std::uint32_t height, std::uint64_t bytes) {
  return {"a.jpg", width, height, 1, bytes, TimeSource::none, ""};
}

ScannedPhoto photoOf(std::uint32_t width, std::uint32_t height, std::uint64_t bytes, float niqe) {
  ScannedPhoto photo = photoOf(width, height, bytes);
  photo.niqe = niqe;
  return photo;
}

constexpr float tooSmall = std::numeric_limits<float>::quiet_NaN();

std::vector<std::size_t> orderOf(const std::vector<Ranked>& ranking) {
  std::vector<std::size_t> order;
  for (const Ranked& ranked : ranking) order.push_back(ranked.photo);
  return order;
}

TEST(BestPhoto, HasTheMostPixels) {
  const std::vector<ScannedPhoto> photos = {photoOf(1000, 800, 900'000), photoOf(3000, 4000, 5000),
                                            photoOf(2000, 1500, 2'000'000)};
  const std::vector<Ranked> ranking = rankGroup({{0, 1, 2}, {}}, photos);
  EXPECT_EQ(orderOf(ranking), (std::vector<std::size_t>{1, 2, 0}));
  EXPECT_EQ(ranking[0].reason, "the most pixels, 12.0 megapixels");
  EXPECT_EQ(ranking[1].reason, "fewer pixels, 3.0 megapixels");
}

TEST(BestPhoto, HasTheLargestFileAmongThoseOfTheMostPixels) {
  const std::vector<ScannedPhoto> photos = {photoOf(4000, 3000, 2'000'000),
                                            photoOf(3000, 4000, 3'500'000)};
  const std::vector<Ranked> ranking = rankGroup({{0, 1}, {}}, photos);
  EXPECT_EQ(orderOf(ranking), (std::vector<std::size_t>{1, 0}));
  EXPECT_EQ(ranking[0].reason, "the largest file, 3.50 MB, among those of 12.0 megapixels");
  EXPECT_EQ(ranking[1].reason, "as many pixels, a smaller file, 2.00 MB");
}

TEST(BestPhoto, LooksTheMostNaturalAmongThoseOfTheMostPixels) {
  const std::vector<ScannedPhoto> photos = {photoOf(4000, 3000, 9'000'000, 6.14f),
                                            photoOf(3000, 2000, 5'000'000, 2.0f),
                                            photoOf(4000, 3000, 2'000'000, 4.2f)};
  const std::vector<Ranked> ranking = rankGroup({{0, 1, 2}, {}}, photos);
  EXPECT_EQ(orderOf(ranking), (std::vector<std::size_t>{2, 0, 1}));
  EXPECT_EQ(ranking[0].reason,
            "the most natural among those of 12.0 megapixels: NIQE 4.2 against 6.1");
  EXPECT_EQ(ranking[1].reason, "as many pixels, less sharp or natural: NIQE 6.1 against 4.2");
  EXPECT_EQ(ranking[2].reason, "fewer pixels, 6.0 megapixels, NIQE 2.0");
}

TEST(BestPhoto, TellsScoresWithAsManyDigitsAsPartThem) {
  const std::vector<ScannedPhoto> photos = {photoOf(4000, 3000, 9, 4.127f),
                                            photoOf(4000, 3000, 9, 4.124f)};
  const std::vector<Ranked> ranking = rankGroup({{0, 1}, {}}, photos);
  EXPECT_EQ(orderOf(ranking), (std::vector<std::size_t>{1, 0}));
  EXPECT_THAT(ranking[1].reason, HasSubstr("NIQE 4.13 against 4.12"));
}

TEST(BestPhoto, IsTheLargestFileAmongEqualScores) {
  const std::vector<ScannedPhoto> photos = {photoOf(4000, 3000, 2'000'000, 4.2f),
                                            photoOf(4000, 3000, 3'500'000, 4.2f)};
  const std::vector<Ranked> ranking = rankGroup({{0, 1}, {}}, photos);
  EXPECT_EQ(orderOf(ranking), (std::vector<std::size_t>{1, 0}));
  EXPECT_EQ(ranking[0].reason,
            "the largest file, 3.50 MB, among those of 12.0 megapixels, NIQE 4.2");
  EXPECT_EQ(ranking[1].reason, "as many pixels, a smaller file, 2.00 MB, NIQE 4.2");
}

TEST(BestPhoto, IsScoredBeforeThoseTooSmallOrNotScored) {
  const std::vector<ScannedPhoto> photos = {
      photoOf(90, 200, 5'000, tooSmall), photoOf(150, 120, 9'000), photoOf(120, 150, 1'000, 20.0f)};
  const std::vector<Ranked> ranking = rankGroup({{0, 1, 2}, {}}, photos);
  EXPECT_EQ(orderOf(ranking), (std::vector<std::size_t>{2, 1, 0}));
  EXPECT_EQ(ranking[0].reason,
            "the only one with a score among those of 0.0 megapixels, NIQE 20.0");
  EXPECT_EQ(ranking[1].reason, "as many pixels, not scored");
  EXPECT_EQ(ranking[2].reason, "as many pixels, too small to score");
}

TEST(BestPhoto, IsTheLargestFileAmongThoseTooSmallToScore) {
  const std::vector<ScannedPhoto> photos = {photoOf(90, 200, 1'000, tooSmall),
                                            photoOf(90, 200, 30'000, tooSmall)};
  const std::vector<Ranked> ranking = rankGroup({{0, 1}, {}}, photos);
  EXPECT_EQ(orderOf(ranking), (std::vector<std::size_t>{1, 0}));
  EXPECT_THAT(ranking[0].reason, HasSubstr("the largest file, 0.03 MB"));
  EXPECT_EQ(ranking[1].reason, "as many pixels, a smaller file, 0.00 MB, too small to score");
}

TEST(BestPhoto, NeedsScoresOnlyWhereResolutionsOfAGroupAreEqual) {
  const std::vector<ScannedPhoto> photos = {photoOf(400, 300, 1), photoOf(300, 400, 1),
                                            photoOf(800, 600, 1), photoOf(800, 600, 1),
                                            photoOf(640, 480, 1)};
  EXPECT_EQ(photosToScore({{{0, 1, 2}, {}}, {{3, 4}, {}}}, photos),
            (std::vector<std::size_t>{0, 1}));
}

TEST(BestPhoto, IsTheFirstOfEquals) {
  const std::vector<ScannedPhoto> photos(3, photoOf(4000, 3000, 2'000'000));
  const std::vector<Ranked> ranking = rankGroup({{0, 2}, {}}, photos);
  EXPECT_EQ(orderOf(ranking), (std::vector<std::size_t>{0, 2}));
  EXPECT_THAT(ranking[0].reason, HasSubstr("the first of those"));
  EXPECT_THAT(ranking[1].reason, HasSubstr("listed later"));
}

}  // namespace
}  // namespace pelorin::photo
