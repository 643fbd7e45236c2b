#include "image_processing/autoenhance/masks/flatness_table.h"

#include <gtest/gtest.h>

#include <cstring>
#include <utility>

#include "image_processing/autoenhance/masks/flatness_mask.h"
#include "tests/support/float_images.h"

namespace pelorin::image_processing {
namespace {

using test_support::randomImage;

// Heights below and above a window, and radii from none to above the height.
template <typename Check>
void forEveryTable(const Check& check) {
  for (const std::uint32_t height : {1u, 2u, 5u, 8u, 17u, 40u}) {
    for (const int radius : {0, 1, 2, 8, 20}) {
      SCOPED_TRACE(testing::Message() << height << " rows, radius " << radius);
      check(FlatnessTable(3, height, radius), height);
    }
  }
}

TEST(FlatnessTable, KnowsTheFirstOfItsRowsThatARowOfThePictureMakes) {
  forEveryTable([](const FlatnessTable& table, std::uint32_t height) {
    for (std::uint32_t y = 0; y < height; ++y) {
      std::int64_t first = 0;
      while (first < table.height() && table.sourceOf(first) != y) ++first;
      EXPECT_EQ(table.firstOf(y), first) << "row " << y;
    }
  });
}

TEST(FlatnessTable, NeedsNoRowOfThePictureBehindTheEnd) {
  forEveryTable([](const FlatnessTable& table, std::uint32_t height) {
    std::uint32_t needed = 0;
    for (std::int64_t end = 1; end <= table.height(); ++end) {
      needed = std::max(needed, table.sourceOf(end - 1) + 1);
      EXPECT_GE(table.sourceEnd(end), needed) << end;
      EXPECT_LE(table.sourceEnd(end), height) << end;
    }
    EXPECT_EQ(table.shapedEnd(table.height()), height);
    EXPECT_EQ(table.shapedEnd(0), 0u);
  });
}

TEST(FlatnessTable, MakesTheMaskWhateverTheOrderOfWeighing) {
  constexpr std::uint32_t width = 21, height = 50;
  constexpr int radius = 3, groups = 3;
  const Image<float> lightness = randomImage(width, height, 1);
  Image<float> smoothed = randomImage(width, height, 2);
  for (std::size_t i = 0; i < smoothed.pixelCount(); ++i) {
    float& value = smoothed.data.get()[i];
    value = lightness.data.get()[i] + 0.05f * value;
  }
  Image<float> expected(width, height);
  computeFlatnessMaskScalar(lightness, smoothed, radius, expected);
  Image<float> mask(width, height);
  FlatnessTable table(width, height, radius, groups);
  std::uint32_t y = 0;
  for (std::int64_t i = 0; i < table.height(); i += groups * sumRowsAtOnce) {
    const std::int64_t end = std::min(i + groups * sumRowsAtOnce, table.height());
    for (std::int64_t row = end; row-- > i;) {
      const std::uint32_t source = table.sourceOf(row);
      table.weigh(row, lightness.row(source), smoothed.row(source));
    }
    for (std::int64_t group = i; group < end; group += sumRowsAtOnce) {
      table.sum(group);
      const std::uint32_t shaped = table.shapedEnd(std::min(group + sumRowsAtOnce, end));
      for (; y < shaped; ++y) table.shape(y, mask.row(y));
    }
  }
  ASSERT_EQ(y, height);
  EXPECT_EQ(std::memcmp(mask.data.get(), expected.data.get(), mask.byteSize()), 0);
}

}  // namespace
}  // namespace pelorin::image_processing
