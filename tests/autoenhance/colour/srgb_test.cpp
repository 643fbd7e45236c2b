#include "image_processing/autoenhance/colour/srgb.h"

#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <type_traits>

#include "image_processing/autoenhance/colour/colour_tables.h"

namespace pelorin::image_processing {
namespace {

TEST(SRGBEncoder, TruncatesAndClips) {
  const Uint8_Gamma_sRGB_Table& encode = colourTables().encode;
  EXPECT_EQ(encode(1.0f), 255);
  EXPECT_EQ(encode(0.999f), 254);
  EXPECT_EQ(encode(-0.5f), 0);
  EXPECT_EQ(encode(-1e30f), 0);
  EXPECT_EQ(encode(1.5f), 255);
  EXPECT_EQ(encode(1e30f), 255);
  EXPECT_EQ(encode(0.0f), 0);
  EXPECT_EQ(encode(std::nanf("")), 0);
}

TEST(SRGBEncoder, HasTheSameCodesInFloats) {
  const ColourTables& tables = colourTables();
  for (int step = 0; step < 1024; ++step) {
    EXPECT_EQ(tables.codes[step], tables.encode((static_cast<float>(step) + 0.5f) / 1023.0f));
  }
}

TEST(SRGBToLinearTable, IsTheFormulaRoundedOnce) {
  static_assert(std::is_same_v<decltype(sRGBToLinearTable), const std::array<float, 256>>);
  for (int code = 0; code < 256; ++code) {
    const double c = code / 255.0;
    const double linear = c <= 0.04045 ? c / 12.92 : std::pow((c + 0.055) / 1.055, 2.4);
    EXPECT_EQ(sRGBToLinearTable[code], static_cast<float>(linear)) << code;
  }
  EXPECT_EQ(sRGBToLinearTable[0], 0.0f);
  EXPECT_EQ(sRGBToLinearTable[255], 1.0f);
}

}  // namespace
}  // namespace pelorin::image_processing
