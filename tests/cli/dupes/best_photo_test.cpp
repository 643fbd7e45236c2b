#include "cli/dupes/best_photo.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace pelorin::cli {
namespace {

using testing::HasSubstr;

ScannedPhoto photoOf(std::uint32_t width, std::uint32_t height, std::uint64_t bytes) {
  return {{"a.jpg", {}}, width, height, 1, bytes, TimeSource::none, ""};
}

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

TEST(BestPhoto, IsTheFirstOfEquals) {
  const std::vector<ScannedPhoto> photos(3, photoOf(4000, 3000, 2'000'000));
  const std::vector<Ranked> ranking = rankGroup({{0, 2}, {}}, photos);
  EXPECT_EQ(orderOf(ranking), (std::vector<std::size_t>{0, 2}));
  EXPECT_THAT(ranking[0].reason, HasSubstr("the first of those"));
  EXPECT_THAT(ranking[1].reason, HasSubstr("listed later"));
}

}  // namespace
}  // namespace pelorin::cli
