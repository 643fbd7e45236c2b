#include "image_processing/autoenhance/colour/lab.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>

namespace pelorin::image_processing {
namespace {

TEST(RgbToLab, MapsWhiteToExactly100AndBlackToExactlyZero) {
  const Lab white = rgbToLab(255, 255, 255);
  EXPECT_EQ(white.L, 100.0f);
  EXPECT_NEAR(white.a, 0.0f, 0.05f);
  EXPECT_NEAR(white.b, 0.0f, 0.05f);
  const Lab black = rgbToLab(0, 0, 0);
  EXPECT_EQ(black.L, 0.0f);
  EXPECT_EQ(black.a, 0.0f);
  EXPECT_EQ(black.b, 0.0f);
}

TEST(LabToRgb, ComesBackWithinAFewCodesForMostColoursAnd18AtWorst) {
  int worst = 0;
  long sum = 0, count = 0;
  for (int r = 0; r < 256; r += 5) {
    for (int g = 0; g < 256; g += 5) {
      for (int b = 0; b < 256; b += 3) {
        std::uint8_t r2, g2, b2;
        labToRgb(rgbToLab(r, g, b), r2, g2, b2);
        for (const int difference : {std::abs(r - r2), std::abs(g - g2), std::abs(b - b2)}) {
          worst = std::max(worst, difference);
          sum += difference;
          ++count;
        }
      }
    }
  }
  EXPECT_LE(worst, 18);
  EXPECT_LT(static_cast<double>(sum) / count, 1.2);
}

}  // namespace
}  // namespace pelorin::image_processing
