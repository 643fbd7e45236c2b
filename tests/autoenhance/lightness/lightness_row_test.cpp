#include "image_processing/autoenhance/lightness/lightness_row.h"

#include <gtest/gtest.h>

#include "image_processing/autoenhance/colour/lab.h"
#include "image_processing/autoenhance/colour/lab_constants.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

TEST(LightnessRow, IsEachPixelsLightness) {
  const auto photo = test_support::noisePicture(37, 5, 1);
  LightnessRow lightness(photo.width);
  for (std::uint32_t y = 0; y < photo.height; ++y) {
    const float* const row = lightness.of(photo.row(y));
    for (std::uint32_t x = 0; x < photo.width; ++x) {
      const RGBA8Pixel& p = photo.row(y)[x];
      ASSERT_EQ(row[x], rgbToLab(p.r, p.g, p.b).L / labWhite) << x << ", " << y;
    }
  }
}

TEST(LightnessRow, GoesFromBlackToWhite) {
  Image<RGBA8Pixel> photo(2, 1);
  photo.row(0)[0] = {0, 0, 0, 255};
  photo.row(0)[1] = {255, 255, 255, 0};  // alpha is ignored
  LightnessRow lightness(photo.width);
  const float* const row = lightness.of(photo.row(0));
  EXPECT_EQ(row[0], 0.0f);
  EXPECT_EQ(row[1], 1.0f);
}

}  // namespace
}  // namespace pelorin::image_processing
