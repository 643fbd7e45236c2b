#include "cli/pictures/canvas.h"

#include <gtest/gtest.h>

#include <new>

#include "tests/support/pictures.h"

namespace pelorin::cli {
namespace {

using image_processing::RGBA8Pixel;

TEST(Canvas, IsWhiteAtFirst) {
  const auto picture = Canvas(3, 2).picture();
  ASSERT_EQ(picture.pixelCount(), 6u);
  for (int i = 0; i < 6; ++i) EXPECT_EQ(picture.data.get()[i], (RGBA8Pixel{255, 255, 255, 255}));
}

TEST(Canvas, ShowsAPastedPictureWithoutItsAlpha) {
  Canvas canvas(40, 30);
  const auto noise = test_support::noisePicture(8, 5, 3);
  canvas.paste(noise, 32, 25);
  const auto picture = canvas.picture();
  for (std::uint32_t y = 0; y < 30; ++y) {
    for (std::uint32_t x = 0; x < 40; ++x) {
      RGBA8Pixel expected{255, 255, 255, 255};
      if (x >= 32 && y >= 25) expected = noise.row(y - 25)[x - 32];
      expected.a = 255;
      ASSERT_EQ(picture.row(y)[x], expected);
    }
  }
}

TEST(Canvas, DrawsAtItsScale) {
  const Canvas canvas(10, 10, 2);
  setColour(canvas.context(), {1, 0, 0});
  cairo_rectangle(canvas.context(), 1, 1, 2, 2);
  cairo_fill(canvas.context());
  const auto picture = canvas.picture();
  EXPECT_EQ(picture.row(2)[2], (RGBA8Pixel{255, 0, 0, 255}));
  EXPECT_EQ(picture.row(5)[5], (RGBA8Pixel{255, 0, 0, 255}));
  EXPECT_EQ(picture.row(1)[2], (RGBA8Pixel{255, 255, 255, 255}));
  EXPECT_EQ(picture.row(6)[5], (RGBA8Pixel{255, 255, 255, 255}));
}

TEST(Canvas, IsAsLargeAsCairoDrawsAndNoLarger) {
  EXPECT_EQ(Canvas(Canvas::largestSide, 1).picture().width, Canvas::largestSide);
  EXPECT_THROW(Canvas(Canvas::largestSide + 1, 1), std::bad_alloc);
  EXPECT_THROW(Canvas(1, 4294967295u), std::bad_alloc);
}

}  // namespace
}  // namespace pelorin::cli
