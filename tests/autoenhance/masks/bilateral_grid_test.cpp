#include "image_processing/autoenhance/masks/bilateral_grid.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <utility>

#include "tests/autoenhance/masks/noisy_edge.h"
#include "tests/support/fingerprint.h"
#include "tests/support/float_images.h"
#include "tests/support/instruction_sets.h"
#include "tests/support/mask_types.h"

namespace pelorin::image_processing {
namespace {

using test_support::Quantized;

using test_support::constantImage;
using test_support::fingerprint;
using test_support::randomImage;

Image<float> gridSmoothed(const Image<float>& image, float sigmaRange, float spatial) {
  Image<float> smoothed(image.width, image.height);
  bilateralFilterGridApproximation(image, sigmaRange, spatial, smoothed);
  return smoothed;
}

TEST(BilateralGrid, KeepsAConstantImage) {
  for (const float value : {0.0f, 0.125f, 0.37f, 1.0f}) {
    const Image<float> image = constantImage(47, 31, value);
    for (const float spatial : {1.0f, 3.9f, 8.0f, 31.0f}) {
      const Image<float> smoothed = gridSmoothed(image, 0.7f, spatial);
      for (std::size_t i = 0; i < image.pixelCount(); ++i) {
        ASSERT_NEAR(smoothed.data.get()[i], value, 2.5e-5f) << spatial;
      }
    }
  }
}

TEST(BilateralGrid, KeepsAnEdgeAndSmoothsWhatLiesBesideIt) {
  test_support::expectSmoothedBesideTheEdge(gridSmoothed(test_support::noisyEdge(), 0.3f, 6.0f));
}

TEST(BilateralGrid, IsAllZeroBelowAThirtySecondOfRange) {
  const Image<float> image = randomImage(40, 30, 4);
  for (const float sigma : {0.03f, 0.0f, -1.0f, -1e30f, std::nanf("")}) {
    const Image<float> smoothed = gridSmoothed(image, sigma, 4.0f);
    for (std::size_t i = 0; i < image.pixelCount(); ++i) {
      ASSERT_EQ(smoothed.data.get()[i], 0.0f) << sigma;
    }
  }
}

TEST(BilateralGrid, TakesAnyRange) {
  const Image<float> image = randomImage(40, 30, 5);
  for (const float sigma : {1.0f, 5.0f, 1e30f, std::numeric_limits<float>::infinity()}) {
    const Image<float> smoothed = gridSmoothed(image, sigma, 4.0f);
    for (std::size_t i = 0; i < image.pixelCount(); ++i) {
      ASSERT_TRUE(std::isfinite(smoothed.data.get()[i])) << sigma;
    }
  }
}

TEST(BilateralGrid, PutsWhiteIntoTheLastBinAndReadsItBack) {
  Image<float> image = constantImage(20, 20, 0.0f);
  for (std::uint32_t y = 0; y < 20; ++y) {
    for (std::uint32_t x = 10; x < 20; ++x) image.row(y)[x] = 1.0f;
  }
  const Image<float> smoothed = gridSmoothed(image, 0.5f, 5.0f);
  EXPECT_NEAR(smoothed.row(10)[19], 1.0f, 1e-5f);
  EXPECT_NEAR(smoothed.row(10)[0], 0.0f, 1e-5f);
}

TEST(BilateralGrid, ReturnsTheLastNodesValueBeyondTheLastNode) {
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

TEST(BilateralGrid, TakesAnySizeAndCell) {
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

template <typename T>
class BilateralGridOf : public testing::Test {};
TYPED_TEST_SUITE(BilateralGridOf, test_support::MaskTypes);

TYPED_TEST(BilateralGridOf, ExtraordinaryLightnessIsItsDefinition) {
  constexpr float infinity = std::numeric_limits<float>::infinity();
  for (const float odd : {std::nanf(""), -std::nanf(""), infinity, -infinity, 3e38f, -3e38f, 1e30f,
                          1e20f, -0.5f, -0.0f, 7.0f}) {
    SCOPED_TRACE(odd);
    const Image<float> image = randomImage(67, 45, 9);
    for (const std::uint32_t at : {0u, 700u, 701u, 1500u, 67u * 45u - 1}) {
      image.data.get()[at] = odd;
    }
    Image<TypeParam> expected(67, 45), smoothed(67, 45);
    bilateralFilterGridApproximationScalar(image, 0.7f, 4.0f, expected);
    test_support::onEveryInstructionSet([&] {
      bilateralFilterGridApproximation(image, 0.7f, 4.0f, smoothed);
      ASSERT_EQ(fingerprint(smoothed), fingerprint(expected));
    });
  }
}

TEST(BilateralGrid, StoresTheTruncatedByteInAnEightBitMask) {
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

}  // namespace
}  // namespace pelorin::image_processing
