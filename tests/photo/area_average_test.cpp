#include "photo/area_average.h"

#include <gtest/gtest.h>

#include <cmath>

#include "tests/support/pictures.h"

namespace pelorin::photo {
namespace {

using image_processing::Image;
using image_processing::RGBA8Pixel;
using test_support::flatPicture;
using test_support::noisePicture;

TEST(FitWithin, KeepsASmallPictureAsItIs) {
  EXPECT_EQ(fitWithin({320, 200}, {320, 320}), (PictureSize{320, 200}));
  EXPECT_EQ(fitWithin({1, 1}, {320, 320}), (PictureSize{1, 1}));
}

TEST(FitWithin, TouchesTheBoxWithItsLongerSide) {
  EXPECT_EQ(fitWithin({4000, 3000}, {320, 320}), (PictureSize{320, 240}));
  EXPECT_EQ(fitWithin({3000, 4000}, {320, 320}), (PictureSize{240, 320}));
  EXPECT_EQ(fitWithin({1000, 1000}, {320, 200}), (PictureSize{200, 200}));
}

TEST(FitWithin, LeavesAThinPictureOnePixel) {
  EXPECT_EQ(fitWithin({65500, 1}, {320, 320}), (PictureSize{320, 1}));
  EXPECT_EQ(fitWithin({1, 65500}, {320, 320}), (PictureSize{1, 320}));
  EXPECT_EQ(fitWithin({4294967295u, 4294967295u}, {320, 320}), (PictureSize{320, 320}));
}

TEST(AreaAverage, KeepsAFlatPictureFlatAtAnySize) {
  const RGBA8Pixel colour{13, 200, 255, 255};
  for (const PictureSize from : {PictureSize{1, 1}, {7, 5}, {640, 480}, {65500, 1}, {1, 65500}}) {
    const auto picture = flatPicture(from.width, from.height, colour);
    for (const PictureSize to : {PictureSize{1, 1}, {3, 2}, {320, 240}}) {
      const auto small = areaAverage(picture, to);
      ASSERT_EQ((PictureSize{small.width, small.height}), to);
      for (std::size_t i = 0; i < small.pixelCount(); ++i) ASSERT_EQ(small.data.get()[i], colour);
    }
  }
}

TEST(AreaAverage, IsTheIdentityAtTheSameSizeButForAlpha) {
  const auto picture = noisePicture(37, 23, 1);
  const auto same = areaAverage(picture, {37, 23});
  for (std::size_t i = 0; i < picture.pixelCount(); ++i) {
    RGBA8Pixel expected = picture.data.get()[i];
    expected.a = 255;
    ASSERT_EQ(same.data.get()[i], expected);
  }
}

TEST(AreaAverage, TurnsACheckerboardIntoItsMean) {
  Image<RGBA8Pixel> board(8, 8);
  for (std::uint32_t y = 0; y < 8; ++y) {
    for (std::uint32_t x = 0; x < 8; ++x) {
      board.row(y)[x] = (x + y) % 2 == 0 ? RGBA8Pixel{0, 10, 255, 0} : RGBA8Pixel{255, 20, 255, 0};
    }
  }
  const auto small = areaAverage(board, {4, 4});
  for (std::size_t i = 0; i < small.pixelCount(); ++i)
    ASSERT_EQ(small.data.get()[i], (RGBA8Pixel{128, 15, 255, 255}));
}

TEST(AreaAverage, SplitsAPixelBetweenItsTwoNeighbours) {
  Image<RGBA8Pixel> three(3, 1);
  for (std::uint8_t x = 0; x < 3; ++x) {
    const auto value = static_cast<std::uint8_t>(90 * x);
    three.row(0)[x] = {value, value, value, 255};
  }
  const auto two = areaAverage(three, {2, 1});
  EXPECT_EQ(two.row(0)[0].r, 30);   // (0 + 90 / 2) / 1.5
  EXPECT_EQ(two.row(0)[1].r, 150);  // (90 / 2 + 180) / 1.5
}

TEST(AreaAverage, EqualsTheIntegralOverEachNewPixel) {
  const auto picture = noisePicture(29, 31, 7);
  const PictureSize size{12, 7};
  const auto small = areaAverage(picture, size);
  const auto overlap = [](double a0, double a1, double b0, double b1) {
    return std::max(0.0, std::min(a1, b1) - std::max(a0, b0));
  };
  for (std::uint32_t y = 0; y < size.height; ++y) {
    for (std::uint32_t x = 0; x < size.width; ++x) {
      const double wide = 29.0 / size.width, high = 31.0 / size.height;
      double sum = 0;
      for (std::uint32_t j = 0; j < 31; ++j) {
        for (std::uint32_t i = 0; i < 29; ++i) {
          sum += overlap(i, i + 1, x * wide, (x + 1) * wide) *
                 overlap(j, j + 1, y * high, (y + 1) * high) * picture.row(j)[i].g;
        }
      }
      ASSERT_NEAR(small.row(y)[x].g, sum / (wide * high), 0.501) << x << ", " << y;
    }
  }
}

TEST(AreaAverage, DoesNotOverflowOnTheLargestSides) {
  const auto white = flatPicture(65500, 64, {255, 255, 255, 255});
  EXPECT_EQ(areaAverage(white, {1, 1}).row(0)[0], (RGBA8Pixel{255, 255, 255, 255}));
}

}  // namespace
}  // namespace pelorin::photo
