#include "image_processing/autoenhance/colour/srgb.h"

#include <gtest/gtest.h>

#include <cmath>

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

TEST(SRGBDecoding, RunsFromZeroToOne) {
  const auto& linear = colourTables().linear;
  EXPECT_EQ(linear[0], 0.0f);
  EXPECT_EQ(linear[255], 1.0f);
  for (int code = 1; code < 256; ++code) EXPECT_GT(linear[code], linear[code - 1]);
}

}  // namespace
}  // namespace pelorin::image_processing
