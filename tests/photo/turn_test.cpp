#include <gtest/gtest.h>

#include <algorithm>
#include <string>

#include "photo/turned_image.h"

namespace pelorin::photo {
namespace {

using image_processing::Image;
using image_processing::makeSharedImage;
using image_processing::RGBA8Pixel;

// A picture from rows of letters, and back.
std::shared_ptr<Image<RGBA8Pixel>> picture(const std::vector<std::string>& rows) {
  auto image = makeSharedImage<RGBA8Pixel>(static_cast<std::uint32_t>(rows[0].size()),
                                           static_cast<std::uint32_t>(rows.size()));
  for (std::uint32_t y = 0; y < image->height; ++y) {
    for (std::uint32_t x = 0; x < image->width; ++x) {
      image->row(y)[x] = {static_cast<std::uint8_t>(rows[y][x]), 1, 2, 3};
    }
  }
  return image;
}

std::vector<std::string> rowsOf(const Image<RGBA8Pixel>& image) {
  std::vector<std::string> rows(image.height);
  for (std::uint32_t y = 0; y < image.height; ++y) {
    for (std::uint32_t x = 0; x < image.width; ++x) {
      rows[y] += static_cast<char>(image.row(y)[x].r);
      EXPECT_EQ(image.row(y)[x], (RGBA8Pixel{image.row(y)[x].r, 1, 2, 3}));
    }
  }
  return rows;
}

using Rows = std::vector<std::string>;

// Two rows at a time.
std::shared_ptr<Image<RGBA8Pixel>> turned(const std::shared_ptr<Image<RGBA8Pixel>>& source,
                                          Turn turn) {
  const PictureSize size = {source->width, source->height}, after = turnedSize(size, turn);
  auto result = makeSharedImage<RGBA8Pixel>(after.width, after.height);
  for (std::uint32_t y = 0; y < size.height; y += 2)
    turnRows(source->row(y), y, std::min(2u, size.height - y), size, turn, *result);
  return result;
}

TEST(Turn, ShowsEveryExifOrientationUpright) {
  // How a camera stores the upright picture "abc" over "def" under each orientation: which side of
  // it the first stored row and the first stored column are.
  const std::vector<Rows> stored = {
      {"abc", "def"},      // 1: row is top, column is left
      {"cba", "fed"},      // 2: top, right
      {"fed", "cba"},      // 3: bottom, right
      {"def", "abc"},      // 4: bottom, left
      {"ad", "be", "cf"},  // 5: left, top
      {"cf", "be", "ad"},  // 6: right, top
      {"fc", "eb", "da"},  // 7: right, bottom
      {"da", "eb", "fc"},  // 8: left, bottom
  };
  for (int orientation = 1; orientation <= 8; ++orientation) {
    const auto upright = turned(picture(stored[orientation - 1]), uprightTurn(orientation));
    EXPECT_EQ(rowsOf(*upright), (Rows{"abc", "def"})) << orientation;
  }
}

TEST(Turn, GoesOnClockwise) {
  const auto source = picture({"abc", "def"});
  EXPECT_EQ(rowsOf(*turned(source, turnedFurther({}, 90))), (Rows{"da", "eb", "fc"}));
  EXPECT_EQ(rowsOf(*turned(source, turnedFurther({}, 180))), (Rows{"fed", "cba"}));
  EXPECT_EQ(turnedFurther({}, -90), turnedFurther({}, 270));
  EXPECT_EQ(turnedFurther({}, 360), Turn{});
  EXPECT_EQ(turnedFurther({true, 3}, 90), (Turn{true, 0}));
}

TEST(Turn, IsNoneForAnUprightPictureAndForNoOrientation) {
  for (const int orientation : {0, 1, 9}) EXPECT_EQ(uprightTurn(orientation), Turn{});
}

TEST(Turn, FourTimesGivesTheSamePictureAtEverySize) {
  for (const std::uint32_t width : {1u, 31u, 32u, 33u, 70u}) {
    for (const std::uint32_t height : {1u, 32u, 65u}) {
      auto image = makeSharedImage<RGBA8Pixel>(width, height);
      for (std::size_t i = 0; i < image->pixelCount(); ++i) {
        image->data.get()[i] = {static_cast<std::uint8_t>(i * 7), 1, 2, 3};
      }
      auto back = image;
      for (int i = 0; i < 4; ++i) back = turned(back, {false, 1});
      EXPECT_EQ(rowsOf(*back), rowsOf(*image));
      EXPECT_EQ(rowsOf(*turned(turned(image, {true, 1}), {true, 1})), rowsOf(*image));
    }
  }
}

}  // namespace
}  // namespace pelorin::photo
