#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <utility>

#include "image_processing/autoenhance/masks/bilateral_filter.h"
#include "image_processing/autoenhance/masks/bilateral_grid.h"
#include "image_processing/autoenhance/masks/gaussian_approximation.h"
#include "image_processing/autoenhance/masks/mirror.h"
#include "image_processing/autoenhance/masks/trilerp.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using Quantized = QuantizedFloat<unsigned char>;
using test_support::Random;

Image<float> constantImage(std::uint32_t width, std::uint32_t height, float value) {
  Image<float> image(width, height);
  image.set(value);
  return image;
}

Image<float> randomImage(std::uint32_t width, std::uint32_t height, std::uint64_t seed) {
  Image<float> image(width, height);
  Random random(seed);
  for (std::size_t i = 0; i < image.pixelCount(); ++i) image.data.get()[i] = random.nextFloat();
  return image;
}

Image<float> gridSmoothed(const Image<float>& image, float sigmaRange, float spatial) {
  Image<float> smoothed(image.width, image.height);
  bilateralFilterGridApproximation(image, sigmaRange, spatial, smoothed);
  return smoothed;
}

Image<float> exactlySmoothed(const Image<float>& image, float sigmaRange, int radius) {
  Image<float> smoothed(image.width, image.height);
  bilateralFilter(image, sigmaRange, radius, smoothed);
  return smoothed;
}

TEST(GaussianApproximation, IsPeakInTheMiddleAndBaselineFromTheEndsOn) {
  const GaussianApproximation<float> bell(-2.0f, 2.0f, 0.0f, 1.0f);
  EXPECT_EQ(bell(0.0f), 1.0f);
  EXPECT_NEAR(bell(1.0f), std::exp(-1.0f), 1e-6f);
  EXPECT_NEAR(bell(-1.0f), std::exp(-1.0f), 1e-6f);
  for (const float x : {2.0f, -2.0f, 7.0f, -1e30f, std::numeric_limits<float>::infinity()}) {
    EXPECT_EQ(bell(x), 0.0f) << x;
  }
  const GaussianApproximation<float> raised(0.0f, 10.0f, 2.0f, 5.0f);
  EXPECT_EQ(raised(5.0f), 5.0f);
  EXPECT_EQ(raised(-1.0f), 2.0f);
}

TEST(GaussianApproximation, StaysNearTheGaussianItStandsFor) {
  const GaussianApproximation<float> bell(-1.0f, 1.0f, 0.0f, 1.0f);
  for (float t = -1.0f; t <= 1.0f; t += 0.01f) EXPECT_NEAR(bell(t), std::exp(-4 * t * t), 0.03f);
}

TEST(GaussianApproximation, WeighsNothingOverAnEmptySupport) {
  const GaussianApproximation<float> bell(-0.0f, 0.0f, 0.0f, 1.0f);
  EXPECT_EQ(bell(0.0f), 0.0f);
  EXPECT_EQ(bell(0.5f), 0.0f);
  EXPECT_EQ(bell(std::nanf("")), 0.0f);
}

TEST(Reflect, MirrorsAtBothEnds) {
  EXPECT_EQ(reflect(-3, 10), 3);
  EXPECT_EQ(reflect(0, 10), 0);
  EXPECT_EQ(reflect(9, 10), 9);
  EXPECT_EQ(reflect(10, 10), 9);
  EXPECT_EQ(reflect(12, 10), 7);
  EXPECT_EQ(reflect(1, 1), 0);
}

TEST(Reflect, HoldsIndicesFarOutsideToAnEdge) {
  EXPECT_EQ(reflectInto(-30, 10), 9);
  EXPECT_EQ(reflectInto(50, 10), 0);
  EXPECT_EQ(reflectInto(-5, 1), 0);
}

TEST(Trilerp, InterpolatesItsCornersAndExtrapolatesBeyond) {
  const auto at = [](float ty, float tx, float tb) {
    return trilerp(0.0f, 1.0f, 2.0f, 3.0f, 4.0f, 5.0f, 6.0f, 7.0f, ty, tx, tb);
  };
  EXPECT_EQ(at(0, 0, 0), 0.0f);
  EXPECT_EQ(at(1, 0, 0), 1.0f);
  EXPECT_EQ(at(0, 1, 0), 2.0f);
  EXPECT_EQ(at(0, 0, 1), 4.0f);
  EXPECT_EQ(at(1, 1, 1), 7.0f);
  EXPECT_EQ(at(0.5f, 0.5f, 0.5f), 3.5f);
  EXPECT_EQ(at(2, 0, 0), 2.0f);
}

TEST(Smoothing, KeepsAConstantImage) {
  for (const float value : {0.0f, 0.125f, 0.37f, 1.0f}) {
    const Image<float> image = constantImage(47, 31, value);
    for (const float spatial : {1.0f, 3.9f, 8.0f, 31.0f}) {
      const Image<float> smoothed = gridSmoothed(image, 0.7f, spatial);
      for (std::size_t i = 0; i < image.pixelCount(); ++i) {
        ASSERT_NEAR(smoothed.data.get()[i], value, 2.5e-5f) << spatial;
      }
    }
    const Image<float> smoothed = exactlySmoothed(image, 0.7f, 3);
    for (std::size_t i = 0; i < image.pixelCount(); ++i) {
      ASSERT_NEAR(smoothed.data.get()[i], value, 1e-5f);
    }
  }
}

TEST(Smoothing, LeavesAnIsolatedSpikeUnchangedInTheExactFilter) {
  Image<float> image = constantImage(15, 15, 0.1f);
  image.row(7)[7] = 0.9f;
  EXPECT_EQ(exactlySmoothed(image, 0.5f, 2).row(7)[7], 0.9f);
}

TEST(Smoothing, WeighsHorizontalOffsetsOnlyInTheExactFilter) {
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
  const float down = exactlySmoothed(acrossRows, 10.0f, 3).row(4)[4];
  const float across = exactlySmoothed(acrossColumns, 10.0f, 3).row(4)[4];
  EXPECT_NEAR(down, 0.5f + 0.05f * 3 / 7, 1e-4f);
  EXPECT_LT(across, down - 0.003f);
}

TEST(Smoothing, ReturnsEveryPixelUnchangedAtRadiusZeroOrLess) {
  const Image<float> image = randomImage(12, 9, 3);
  for (const int radius : {0, -1, -2147483647 - 1}) {
    const Image<float> smoothed = exactlySmoothed(image, 0.7f, radius);
    for (std::size_t i = 0; i < image.pixelCount(); ++i) {
      ASSERT_EQ(smoothed.data.get()[i], image.data.get()[i]);
    }
  }
}

TEST(Smoothing, IsAllZeroOnTheGridBelowAThirtySecondOfRange) {
  const Image<float> image = randomImage(40, 30, 4);
  for (const float sigma : {0.03f, 0.0f, -1.0f, -1e30f, std::nanf("")}) {
    const Image<float> smoothed = gridSmoothed(image, sigma, 4.0f);
    for (std::size_t i = 0; i < image.pixelCount(); ++i) {
      ASSERT_EQ(smoothed.data.get()[i], 0.0f) << sigma;
    }
  }
}

TEST(Smoothing, TakesAnyRangeOnTheGrid) {
  const Image<float> image = randomImage(40, 30, 5);
  for (const float sigma : {1.0f, 5.0f, 1e30f, std::numeric_limits<float>::infinity()}) {
    const Image<float> smoothed = gridSmoothed(image, sigma, 4.0f);
    for (std::size_t i = 0; i < image.pixelCount(); ++i) {
      ASSERT_TRUE(std::isfinite(smoothed.data.get()[i])) << sigma;
    }
  }
}

TEST(Smoothing, PutsWhiteIntoTheLastBinAndReadsItBack) {
  Image<float> image = constantImage(20, 20, 0.0f);
  for (std::uint32_t y = 0; y < 20; ++y) {
    for (std::uint32_t x = 10; x < 20; ++x) image.row(y)[x] = 1.0f;
  }
  const Image<float> smoothed = gridSmoothed(image, 0.5f, 5.0f);
  EXPECT_NEAR(smoothed.row(10)[19], 1.0f, 1e-5f);
  EXPECT_NEAR(smoothed.row(10)[0], 0.0f, 1e-5f);
}

TEST(Smoothing, ReturnsTheLastNodesValueBeyondTheLastNode) {
  // 23 columns in cells of 5: 4 nodes, the last at column 15. A ramp up to column 14, and one value
  // from there on, so that the columns beyond are read at one lightness.
  Image<float> image(23, 20);
  for (std::uint32_t y = 0; y < 20; ++y) {
    for (std::uint32_t x = 0; x < 23; ++x) {
      image.row(y)[x] = 0.2f + 0.02f * static_cast<float>(std::min(x, 15u));
    }
  }
  const Image<float> smoothed = gridSmoothed(image, 0.7f, 5.0f);
  const float atTheNode = smoothed.row(10)[15];
  EXPECT_LT(atTheNode, 0.499f) << "the ramp must be felt at the last node";
  EXPECT_LT(smoothed.row(10)[10], atTheNode - 0.02f) << "the nodes must differ";
  for (std::uint32_t x = 16; x < 23; ++x) EXPECT_NEAR(smoothed.row(10)[x], atTheNode, 1e-6f) << x;
}

TEST(Smoothing, TakesAnySizeAndCell) {
  for (const auto& [width, height] :
       {std::pair{1u, 1u}, {1u, 40u}, {40u, 1u}, {2u, 3u}, {65500u, 1u}, {0u, 5u}, {5u, 0u}}) {
    const Image<float> image = randomImage(width, height, 6);
    for (const float spatial : {1.0f, 2.5f, 0.0f, -3.0f, 1e30f, std::nanf("")}) {
      const Image<float> smoothed = gridSmoothed(image, 0.7f, spatial);
      for (std::size_t i = 0; i < image.pixelCount(); ++i) {
        ASSERT_GE(smoothed.data.get()[i], -0.001f);
        ASSERT_LE(smoothed.data.get()[i], 1.001f);
      }
    }
  }
}

TEST(Smoothing, StoresTheTruncatedByteInAnEightBitMask) {
  const Image<float> image = randomImage(33, 21, 7);
  const Image<float> exact = gridSmoothed(image, 0.7f, 3.0f);
  Image<Quantized> bytes(33, 21);
  bilateralFilterGridApproximation(image, 0.7f, 3.0f, bytes);
  for (std::size_t i = 0; i < image.pixelCount(); ++i) {
    Quantized expected;
    expected = exact.data.get()[i];
    ASSERT_EQ(bytes.data.get()[i].stored(), expected.stored());
  }
}

TEST(Smoothing, KeepsAnEdgeAndSmoothsWhatLiesBesideIt) {
  Image<float> image = randomImage(60, 60, 8);
  for (std::uint32_t y = 0; y < 60; ++y) {
    for (std::uint32_t x = 0; x < 60; ++x) {
      image.row(y)[x] = (x < 30 ? 0.1f : 0.9f) + 0.04f * image.row(y)[x];
    }
  }
  for (const Image<float>& smoothed :
       {gridSmoothed(image, 0.3f, 6.0f), exactlySmoothed(image, 0.3f, 6)}) {
    EXPECT_NEAR(smoothed.row(30)[29], 0.12f, 0.02f);
    EXPECT_NEAR(smoothed.row(30)[30], 0.92f, 0.02f);
    for (std::uint32_t x = 5; x < 25; ++x) EXPECT_NEAR(smoothed.row(30)[x], 0.12f, 0.015f);
  }
}

}  // namespace
}  // namespace pelorin::image_processing
