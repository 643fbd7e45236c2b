#include "cli/pictures/heat_map.h"

#include <gtest/gtest.h>

#include <cmath>

#include "tests/support/pictures.h"

namespace pelorin::cli {
namespace {

using image_processing::Image;
using image_processing::RGBA8Pixel;
using test_support::flatPicture;

constexpr RGBA8Pixel plain{128, 128, 128, 255};

/// Finds the pixels of a picture that show points of the photo.
class Finder {
 public:
  Finder(const Image<RGBA8Pixel>& picture, const Image<RGBA8Pixel>& photo)
      : picture_(picture), layout_(photo, "", "") {}

  RGBA8Pixel operator()(double x, double y) const {
    const AnnotatedPhoto::Point at = layout_.at(x, y);
    return picture_.row(static_cast<std::uint32_t>(at.y))[static_cast<std::uint32_t>(at.x)];
  }

 private:
  Image<RGBA8Pixel> picture_;
  AnnotatedPhoto layout_;
};

Image<RGBA8Pixel> heatMapOf(const Image<RGBA8Pixel>& photo, const BlockValues& blocks) {
  return drawHeatMap(photo, blocks, "Title", "Subtitle", "Label");
}

TEST(HeatMap, TintsEachBlockByItsValue) {
  // Shown enlarged, as it is, and smaller.
  for (const std::uint32_t size : {10u, 500u, 2100u}) {
    const auto photo = flatPicture(3 * size + size / 2, 2 * size + size / 2, plain);
    const Finder shownAt(heatMapOf(photo, {size, 3, 2, {1, 5, 9, 9, 1, NAN}}), photo);
    const auto block = [&](double column, double row) {
      return shownAt((column + 0.5) * size, (row + 0.5) * size);
    };
    EXPECT_GT(block(0, 0).b, block(0, 0).r + 40) << size;
    EXPECT_GT(block(1, 0).g, block(1, 0).b + 40) << size;
    EXPECT_GT(block(2, 0).r, block(2, 0).b + 40) << size;
    EXPECT_EQ(block(0, 1), block(2, 0)) << size;
    EXPECT_EQ(block(1, 1), block(0, 0)) << size;
    EXPECT_EQ(block(2, 1), plain) << size;
    EXPECT_EQ(block(2.7, 0), plain) << size;
    EXPECT_EQ(block(0, 1.7), plain) << size;
  }
}

TEST(HeatMap, LetsThePhotoShineThrough) {
  auto photo = flatPicture(800, 400, {0, 0, 0, 255});
  for (std::uint32_t y = 0; y < 400; ++y)
    std::fill_n(photo.row(y) + 400, 400, RGBA8Pixel{255, 255, 255, 255});
  const Finder shownAt(heatMapOf(photo, {400, 2, 1, {4, 4}}), photo);
  EXPECT_GT(shownAt(600, 200).g, shownAt(200, 200).g + 60);
}

TEST(HeatMap, HasNoSeamsBetweenBlocksOfOneValue) {
  const auto photo = flatPicture(2500, 700, plain);  // shown at 4/5
  const Finder shownAt(heatMapOf(photo, {96, 26, 7, std::vector<float>(26 * 7, 3.0f)}), photo);
  const RGBA8Pixel expected = shownAt(10, 10);
  EXPECT_NE(expected, plain);
  for (double x = 1; x < 26 * 96 - 2; ++x) {
    ASSERT_EQ(shownAt(x, 300), expected) << x;
  }
  for (double y = 1; y < 7 * 96 - 2; ++y) {
    ASSERT_EQ(shownAt(300, y), expected) << y;
  }
}

TEST(HeatMap, StaysAReasonableSize) {
  const auto sizes = [](std::uint32_t width, std::uint32_t height) {
    const auto picture = heatMapOf(flatPicture(width, height, plain), {96, 0, 0, {}});
    return std::max(picture.width, picture.height);
  };
  EXPECT_LE(sizes(9000, 96), 2200u);
  EXPECT_LE(sizes(96, 9000), 2200u);
  EXPECT_GE(sizes(1, 1), 800u);
  EXPECT_LE(sizes(799, 799), 1800u);
}

TEST(HeatMap, ExplainsItsColoursBelowThePhoto) {
  const auto photo = flatPicture(900, 900, plain);
  const auto picture = heatMapOf(photo, {450, 2, 2, {1, 2, 3, 4}});
  const double bottom = AnnotatedPhoto(photo, "", "").at(0, 900).y;
  bool blue = false, red = false;
  for (auto y = static_cast<std::uint32_t>(bottom); y < picture.height; ++y) {
    for (std::uint32_t x = 0; x < picture.width; ++x) {
      const RGBA8Pixel& p = picture.row(y)[x];
      blue = blue || p.b > p.r + 150;
      red = red || p.r > p.b + 130;
    }
  }
  EXPECT_TRUE(blue);
  EXPECT_TRUE(red);
}

}  // namespace
}  // namespace pelorin::cli
