#include "image_processing/autoenhance/masks/bilateral_filter.h"

#include <gtest/gtest.h>

#include "tests/autoenhance/masks/noisy_edge.h"
#include "tests/support/float_images.h"

namespace pelorin::image_processing {
namespace {

using test_support::constantImage;
using test_support::randomImage;

Image<float> filtered(const Image<float>& image, float sigmaRange, int radius) {
  Image<float> smoothed(image.width, image.height);
  bilateralFilter(image, sigmaRange, radius, smoothed);
  return smoothed;
}

TEST(BilateralFilter, KeepsAConstantImage) {
  for (const float value : {0.0f, 0.125f, 0.37f, 1.0f}) {
    const Image<float> image = constantImage(47, 31, value);
    const Image<float> smoothed = filtered(image, 0.7f, 3);
    for (std::size_t i = 0; i < image.pixelCount(); ++i) {
      ASSERT_NEAR(smoothed.data.get()[i], value, 1e-5f);
    }
  }
}

TEST(BilateralFilter, KeepsAnEdgeAndSmoothsWhatLiesBesideIt) {
  test_support::expectSmoothedBesideTheEdge(filtered(test_support::noisyEdge(), 0.3f, 6));
}

TEST(BilateralFilter, LeavesAnIsolatedSpikeUnchanged) {
  Image<float> image = constantImage(15, 15, 0.1f);
  image.row(7)[7] = 0.9f;
  EXPECT_EQ(filtered(image, 0.5f, 2).row(7)[7], 0.9f);
}

TEST(BilateralFilter, WeighsHorizontalOffsetsOnly) {
  // Rows weigh alike whatever their distance, so a ramp down the picture averages to its window's
  // mean, while a ramp across keeps to its middle all the same by symmetry; a step tells them
  // apart.
  Image<float> acrossRows(9, 9), acrossColumns(9, 9);
  for (std::uint32_t y = 0; y < 9; ++y) {
    for (std::uint32_t x = 0; x < 9; ++x) {
      acrossRows.row(y)[x] = y < 5 ? 0.5f : 0.55f;
      acrossColumns.row(y)[x] = x < 5 ? 0.5f : 0.55f;
    }
  }
  // At radius 3 the pixel (4, 4) sees 3 of 7 rows, and 3 of 7 columns of smaller weight, beyond.
  const float down = filtered(acrossRows, 10.0f, 3).row(4)[4];
  const float across = filtered(acrossColumns, 10.0f, 3).row(4)[4];
  EXPECT_NEAR(down, 0.5f + 0.05f * 3 / 7, 1e-4f);
  EXPECT_LT(across, down - 0.003f);
}

TEST(BilateralFilter, ReturnsEveryPixelUnchangedAtRadiusZeroOrLess) {
  const Image<float> image = randomImage(12, 9, 3);
  for (const int radius : {0, -1, -2147483647 - 1}) {
    const Image<float> smoothed = filtered(image, 0.7f, radius);
    for (std::size_t i = 0; i < image.pixelCount(); ++i) {
      ASSERT_EQ(smoothed.data.get()[i], image.data.get()[i]);
    }
  }
}

}  // namespace
}  // namespace pelorin::image_processing
