#include "cli/pictures/sheet_painter.h"

#include <gtest/gtest.h>

#include "cli/pictures/canvas.h"
#include "tests/support/pictures.h"

namespace pelorin::cli {
namespace {

using image_processing::Image;
using image_processing::RGBA8Pixel;
using test_support::flatPicture;

constexpr RGBA8Pixel redPixel{255, 0, 0, 255}, bluePixel{0, 0, 255, 255};

/// The bounding box of a colour; right and bottom exclusive.
struct Box {
  std::uint32_t left = UINT32_MAX, top = UINT32_MAX, right = 0, bottom = 0;
};

Box boxOf(const Image<RGBA8Pixel>& picture, const RGBA8Pixel& colour) {
  Box box;
  for (std::uint32_t y = 0; y < picture.height; ++y) {
    for (std::uint32_t x = 0; x < picture.width; ++x) {
      if (picture.row(y)[x] != colour) continue;
      box = {std::min(box.left, x), std::min(box.top, y), std::max(box.right, x + 1),
             std::max(box.bottom, y + 1)};
    }
  }
  return box;
}

int inkIn(const Image<RGBA8Pixel>& picture, std::uint32_t top, std::uint32_t bottom) {
  int ink = 0;
  for (std::uint32_t y = top; y < bottom; ++y) {
    for (std::uint32_t x = 0; x < picture.width; ++x) ink += picture.row(y)[x].g < 140;
  }
  return ink;
}

TEST(SheetPainter, ShowsEveryPictureWholeAndInItsColumn) {
  const SheetPainter painter({"Title", {"Original", "Auto"}, {{200, 150}, {320, 240}}});
  const auto band =
      painter.row(0, "a.jpg", {flatPicture(200, 150, redPixel), flatPicture(200, 150, bluePixel)});
  const Box first = boxOf(band, redPixel), second = boxOf(band, bluePixel);
  EXPECT_EQ(first.right - first.left, 200u);
  EXPECT_EQ(first.bottom - first.top, 150u);
  EXPECT_EQ(second.right - second.left, 200u);
  EXPECT_EQ(second.top, first.top);
  EXPECT_GE(second.left, first.right + 320 - 200);  // the columns are as wide as the widest row
  EXPECT_LE(second.right, band.width);
}

TEST(SheetPainter, WritesTheNameAboveAndTheLabelsBelow) {
  const SheetPainter painter({"", {"Original", "Auto"}, {{200, 150}}});
  const auto band =
      painter.row(0, "a.jpg", {flatPicture(200, 150, redPixel), flatPicture(200, 150, redPixel)});
  const Box pictures = boxOf(band, redPixel);
  EXPECT_GT(inkIn(band, 0, pictures.top), 30);
  EXPECT_GT(inkIn(band, pictures.bottom, band.height), 60);
}

TEST(SheetPainter, MakesBandsThatFillTheSheetExactly) {
  for (const char* title : {"", "Title"}) {
    const SheetPainter painter({title, {"Original"}, {{320, 1}, {1, 320}, {17, 33}}});
    std::uint64_t height = painter.heading().height;
    EXPECT_EQ(painter.heading().width, painter.width());
    for (std::size_t i = 0; i < 3; ++i) {
      const auto band = painter.row(i, "name", {}, "gone");
      EXPECT_EQ(band.width, painter.width());
      height += band.height;
    }
    EXPECT_EQ(height, painter.height());
  }
}

TEST(SheetPainter, WritesTheTitleOnlyWhenThereIsOne) {
  const auto with = SheetPainter({"Title", {"Original"}, {{200, 150}}}).heading();
  const auto without = SheetPainter({"", {"Original"}, {{200, 150}}}).heading();
  EXPECT_GT(inkIn(with, 0, with.height), 30);
  EXPECT_EQ(inkIn(without, 0, without.height), 0);
}

TEST(SheetPainter, SaysWhyAPhotoIsMissing) {
  const SheetPainter painter({"", {"Original", "Auto"}, {{200, 150}}});
  const auto said = painter.row(0, "a.jpg", {}, "truncated");
  const auto silent = painter.row(0, "a.jpg", {}, "");
  EXPECT_GT(inkIn(said, 40, said.height), inkIn(silent, 40, silent.height) + 20);
}

TEST(SheetPainter, KeepsLongNamesOfAnyBytesInside) {
  const SheetPainter painter({std::string(3000, 'T'), {std::string(3000, '\xFF')}, {{1, 1}}});
  const auto band = painter.row(0, std::string(3000, 'm'), {flatPicture(1, 1, redPixel)});
  for (const auto& picture : {band, painter.heading()}) {
    for (std::uint32_t y = 0; y < picture.height; ++y) {
      EXPECT_GT(picture.row(y)[0].g, 200);
      EXPECT_GT(picture.row(y)[picture.width - 1].g, 200);
    }
  }
}

TEST(SheetPainter, KnowsWhatDoesNotFit) {
  EXPECT_TRUE(SheetPainter({"", {"Original"}, {{320, 240}}}).fits());
  EXPECT_FALSE(SheetPainter({"", std::vector<std::string>(100, "a"), {{320, 240}}}).fits());
  EXPECT_FALSE(SheetPainter({"", {"a"}, std::vector<photo::PictureSize>(300, {320, 240})}).fits());
  EXPECT_FALSE(SheetPainter({"", {"a", "b"}, {{4294967295u, 4294967295u}}}).fits());
}

}  // namespace
}  // namespace pelorin::cli
