#include "image_processing/autoenhance/lightness/lightness_rows.h"

#include <gtest/gtest.h>

#include "image_processing/autoenhance/colour/lab.h"
#include "image_processing/autoenhance/colour/lab_constants.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

TEST(LightnessRows, AreEachPixelsLightnessInAnyOrderOfRows) {
  const auto photo = test_support::noisePicture(37, 5, 1);
  LightnessRows rows(photo);
  for (const std::uint32_t y : {0u, 1u, 1u, 4u, 2u, 0u, 3u, 4u}) {
    const float* const row = rows.row(y);
    for (std::uint32_t x = 0; x < photo.width; ++x) {
      const RGBA8Pixel& p = photo.row(y)[x];
      ASSERT_EQ(row[x], rgbToLab(p.r, p.g, p.b).L / labWhite) << x << ", " << y;
    }
  }
}

TEST(LightnessRows, GoFromBlackToWhite) {
  Image<RGBA8Pixel> photo(2, 1);
  photo.row(0)[0] = {0, 0, 0, 255};
  photo.row(0)[1] = {255, 255, 255, 0};  // alpha is ignored
  LightnessRows rows(photo);
  EXPECT_EQ(rows.row(0)[0], 0.0f);
  EXPECT_EQ(rows.row(0)[1], 1.0f);
}

}  // namespace
}  // namespace pelorin::image_processing
