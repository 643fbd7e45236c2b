#include "image_processing/autoenhance/colour/lab_tables.h"

#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <cstdint>

#include "image_processing/autoenhance/colour/colour_tables.h"

namespace pelorin::image_processing {
namespace {

TEST(XYZ2labTable, StartsAtSixteenOver116) {
  EXPECT_EQ(colourTables().xyzToLab(0.0f), 16.0f / 116.0f);
}

// All 57,599,807 floats do, which takes long; so many of them are tried.
TEST(XYZ2labTable, HasTheCubeRootInDoublePrecisionAsAFloat) {
  const XYZ2labTable& table = colourTables().xyzToLab;
  constexpr std::uint32_t step = 997;
  const auto first = std::bit_cast<std::uint32_t>(std::nextafter(cieEpsilon, 1.0f));
  for (std::uint32_t bits = first; bits <= std::bit_cast<std::uint32_t>(1.0f); bits += step) {
    const auto x = std::bit_cast<float>(bits);
    ASSERT_EQ(table.f(x), static_cast<float>(std::cbrt(static_cast<double>(x)))) << x;
  }
}

TEST(Lab2yTable, EndsAtOne) {
  EXPECT_EQ(colourTables().labToY(100.0f), 1.0f);
}

}  // namespace
}  // namespace pelorin::image_processing
