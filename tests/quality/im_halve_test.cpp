#include "image_processing/quality/im_halve.h"

#include <gtest/gtest.h>

#include <algorithm>

#include "tests/quality/float_images.h"
#include "tests/support/instruction_sets.h"

namespace pelorin::image_processing {
namespace {

using test_support::greyImage;
using test_support::onEveryInstructionSet;
using test_support::sameBytes;

TEST(ImHalve, OfFiveByFiveGivesTwoByTwoFromTheFirstFourRowsAndColumns) {
  Image<float> image(5, 5);
  for (std::uint32_t y = 0; y < 5; ++y)
    for (std::uint32_t x = 0; x < 5; ++x)
      image.row(y)[x] = x == 4 || y == 4 ? 1e6f : static_cast<float>(10 * y + x);
  std::uint32_t width = 5, height = 5;
  imHalve(image, width, height);
  EXPECT_EQ(width, 2u);
  EXPECT_EQ(height, 2u);
  EXPECT_EQ(image.row(0)[0], 5.5f);
  EXPECT_EQ(image.row(0)[1], 7.5f);
  EXPECT_EQ(image.row(1)[0], 25.5f);
  EXPECT_EQ(image.row(1)[1], 27.5f);
}

TEST(ImHalve, AddsAlongTheUpperRowThenTheLower) {
  Image<float> image(2, 2);
  image.row(0)[0] = 1e8f;
  image.row(0)[1] = -1e8f;
  image.row(1)[0] = 3.0f;
  image.row(1)[1] = 1.0f;
  std::uint32_t width = 2, height = 2;
  imHalve(image, width, height);
  EXPECT_EQ(image.row(0)[0], 1.0f);  // any other order loses the small ones
}

TEST(ImHalve, KeepsTheDistanceBetweenRows) {
  Image<float> image(8, 4);
  image.set(0.0f);
  std::fill_n(image.row(2), 16, 4.0f);
  std::uint32_t width = 8, height = 4;
  imHalve(image, width, height);
  EXPECT_EQ(image.width, 8u);
  EXPECT_EQ(image.height, 4u);
  EXPECT_EQ(image.row(0)[3], 0.0f);
  EXPECT_EQ(image.row(1)[3], 4.0f);
}

TEST(ImHalve, OfLessThanTwoRowsOrColumnsIsEmpty) {
  for (const auto& [w, h] : {std::pair{0u, 0u}, {1u, 1u}, {1u, 4u}, {4u, 1u}}) {
    Image<float> image(4, 4);
    image.set(7.0f);
    std::uint32_t width = w, height = h;
    imHalve(image, width, height);
    EXPECT_EQ(width, w / 2);
    EXPECT_EQ(height, h / 2);
    EXPECT_EQ(std::count(image.row(0), image.row(3) + 4, 7.0f), 16);
  }
}

TEST(ImHalve, MatchesItsDefinitionByteForByteOnEveryInstructionSet) {
  onEveryInstructionSet([] {
    for (std::uint32_t width = 0; width <= 70; ++width) {
      const std::uint32_t height = 2 + width % 7;
      // Wider than what is halved: what lies beside it must not be looked at.
      Image<float> expected = greyImage(80, 10, width), actual = greyImage(80, 10, width);
      std::uint32_t expectedWidth = width, expectedHeight = height;
      std::uint32_t actualWidth = width, actualHeight = height;
      imHalveScalar(expected, expectedWidth, expectedHeight);
      imHalve(actual, actualWidth, actualHeight);
      ASSERT_EQ(actualWidth, expectedWidth);
      ASSERT_EQ(actualHeight, expectedHeight);
      ASSERT_TRUE(sameBytes(actual.data.get(), expected.data.get(), actual.pixelCount())) << width;
    }
  });
}

}  // namespace
}  // namespace pelorin::image_processing
