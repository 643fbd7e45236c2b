#include "cli/pictures/grey_picture.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

namespace pelorin::cli {
namespace {

using image_processing::Image;
using image_processing::RGBA8Pixel;

TEST(GreyPicture, GivesBackEveryByteOverItsLargest) {
  Image<float> plane(256, 1);
  for (int i = 0; i < 256; ++i) plane.data.get()[i] = static_cast<float>(i) / 255.0f;
  const auto grey = greyPicture(plane);
  for (int i = 0; i < 256; ++i) {
    const auto shade = static_cast<std::uint8_t>(i);
    ASSERT_EQ(grey.data.get()[i], (RGBA8Pixel{shade, shade, shade, 255}));
  }
}

TEST(GreyPicture, KeepsValuesOutsideAtTheEnds) {
  constexpr float infinity = std::numeric_limits<float>::infinity();
  const float values[] = {-0.1f, -infinity, 1.004f, 7.0f, infinity, NAN, 0.5f};
  const unsigned char expected[] = {0, 0, 255, 255, 255, 0, 128};
  Image<float> plane(7, 1);
  std::copy(std::begin(values), std::end(values), plane.data.get());
  const auto grey = greyPicture(plane);
  for (int i = 0; i < 7; ++i) EXPECT_EQ(grey.data.get()[i].r, expected[i]) << i;
}

TEST(GreyPicture, OfNoPixelsHasNone) {
  EXPECT_EQ(greyPicture(Image<float>(0, 3)).pixelCount(), 0u);
}

}  // namespace
}  // namespace pelorin::cli
