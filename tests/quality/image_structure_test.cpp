#include "image_processing/quality/image_structure.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstring>

#include "tests/quality/float_images.h"
#include "tests/support/instruction_sets.h"

namespace pelorin::image_processing {
namespace {

using test_support::greyImage;
using test_support::onEveryInstructionSet;
using test_support::sameBytes;

std::uint32_t bitsOf(float value) {
  std::uint32_t bits;
  std::memcpy(&bits, &value, sizeof bits);
  return bits;
}

TEST(NiqeWindow, IsTheGaussianRoundedOnce) {
  constexpr double sigma = 7.0 / 6.0;
  double sum = 0.0;
  for (int k = -3; k <= 3; ++k) sum += std::exp(-k * k / (2.0 * sigma * sigma));
  for (int k = -3; k <= 3; ++k)
    EXPECT_EQ(niqeWindow[k + 3],
              static_cast<float>(std::exp(-k * k / (2.0 * sigma * sigma)) / sum));
}

TEST(NiqeWindow, HasTheKnownBits) {
  EXPECT_EQ(bitsOf(niqeWindow[0]), 0x3C4DC94Du);
  EXPECT_EQ(bitsOf(niqeWindow[1]), 0x3DA1708Eu);
  EXPECT_EQ(bitsOf(niqeWindow[2]), 0x3E72FDBEu);
  EXPECT_EQ(bitsOf(niqeWindow[3]), 0x3EAF6D66u);
}

// One pixel written out, with the border's pixels repeated.
float structureAt(const Image<float>& grey, int x, int y) {
  const auto at = [&](int column, int row) {
    return grey.row(static_cast<std::uint32_t>(
        std::clamp(row, 0,
                   static_cast<int>(grey.height) -
                       1)))[std::clamp(column, 0, static_cast<int>(grey.width) - 1)];
  };
  double mean = 0.0, square = 0.0;
  for (int dx = -3; dx <= 3; ++dx) {
    for (int dy = -3; dy <= 3; ++dy) {
      const double weight = static_cast<double>(niqeWindow[dx + 3]) * niqeWindow[dy + 3];
      const double value = at(x + dx, y + dy);
      mean += weight * value;
      square += weight * value * value;
    }
  }
  return static_cast<float>((at(x, y) - mean) / (std::sqrt(std::fabs(square - mean * mean)) + 1.0));
}

TEST(ImageStructure, IsTheNormalisedDifferenceFromTheLocalMean) {
  const Image<float> grey = greyImage(23, 19, 1);
  Image<float> structure(23, 19);
  computeImageStructure(grey, 23, 19, structure);
  for (int y = 0; y < 19; ++y)
    for (int x = 0; x < 23; ++x)
      EXPECT_NEAR(structure.row(y)[x], structureAt(grey, x, y), 2e-3f) << x << ", " << y;
}

TEST(ImageStructure, OfAFlatPictureIsOnlyRounding) {
  Image<float> grey(40, 40), structure(40, 40);
  for (const float value : {0.0f, 0.1f, 128.0f, 255.0f}) {
    grey.set(value);
    computeImageStructure_fast(grey, 40, 40, structure);
    for (std::size_t i = 0; i < structure.pixelCount(); ++i)
      ASSERT_NEAR(structure.data.get()[i], 0.0f, 1e-4f);
  }
}

TEST(ImageStructure, WritesNothingOutsideItsPart) {
  const Image<float> grey = greyImage(60, 20, 2);
  Image<float> structure(70, 24);
  structure.set(-7.0f);
  computeImageStructure_fast(grey, 41, 11, structure);
  for (std::uint32_t y = 0; y < 24; ++y)
    for (std::uint32_t x = 0; x < 70; ++x)
      ASSERT_EQ(structure.row(y)[x] != -7.0f, x < 41 && y < 11) << x << ", " << y;
}

TEST(ImageStructure, TakesAnySize) {
  for (std::uint32_t width = 0; width < 5; ++width) {
    for (std::uint32_t height = 0; height < 5; ++height) {
      const Image<float> grey = greyImage(width, height, 3);
      Image<float> structure(width, height);
      computeImageStructure_fast(grey, width, height, structure);
      for (std::uint32_t y = 0; y < height; ++y)
        for (std::uint32_t x = 0; x < width; ++x)
          EXPECT_NEAR(structure.row(y)[x], structureAt(grey, x, y), 2e-3f);
    }
  }
}

TEST(ImageStructure, MatchesItsDefinitionByteForByteOnEveryInstructionSet) {
  onEveryInstructionSet([] {
    for (std::uint32_t width = 1; width <= 70; ++width) {
      const std::uint32_t height = 1 + width % 11;
      // The part in question lies in wider images of different widths.
      const Image<float> grey = greyImage(width + 5, height, width);
      Image<float> expected(width + 3, height), actual(width + 3, height);
      expected.set(-7.0f);
      actual.set(-7.0f);
      computeImageStructure(grey, width, height, expected);
      computeImageStructure_fast(grey, width, height, actual);
      ASSERT_TRUE(sameBytes(actual.data.get(), expected.data.get(), actual.pixelCount()))
          << width << " x " << height;
    }
  });
}

}  // namespace
}  // namespace pelorin::image_processing
