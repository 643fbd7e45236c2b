#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "image_processing/autoenhance/colour/colour_tables.h"
#include "image_processing/autoenhance/colour/lab.h"
#include "tests/support/fingerprint.h"

namespace pelorin::image_processing {
namespace {

TEST(MonotonicTable, GivesTheLastSampleAtTheTopOfTheUnitRange) {
  const ColourTables& tables = colourTables();
  EXPECT_EQ(tables.xyzToLab(1.0f), tables.xyzToLab.samples().back());
  EXPECT_EQ(tables.labToXz(1.0f), tables.labToXz.samples().back());
  EXPECT_EQ(tables.labToY(100.0f), tables.labToY.samples().back());
  EXPECT_EQ(tables.flatness(1.0f), tables.flatness.samples().back());
}

TEST(MonotonicTable, KeepsWhatFloatArithmeticGivesAtTheTopOfOtherRanges) {
  // 60 · (1023 / 60) falls just below 1023 in float.
  EXPECT_EQ(colourTables().skinA.indexOf(50.0f), 1022);
}

TEST(MonotonicTable, TakesTheFirstSampleBelowTheRange) {
  const XYZ2labTable& table = colourTables().xyzToLab;
  EXPECT_EQ(table.indexOf(-1e-6f), 0);  // truncated to 0 before the clamp
  EXPECT_EQ(table.indexOf(-5.0f), 0);
  EXPECT_EQ(table.indexOf(-std::numeric_limits<float>::infinity()), 0);
  EXPECT_EQ(table.indexOf(std::nanf("")), 0);
}

TEST(MonotonicTable, TakesTheLastSampleAboveTheRange) {
  const XYZ2labTable& table = colourTables().xyzToLab;
  EXPECT_EQ(table.indexOf(1.5f), 9999);
  EXPECT_EQ(table.indexOf(1e30f), 9999);
  EXPECT_EQ(table.indexOf(std::numeric_limits<float>::infinity()), 9999);
}

TEST(MonotonicTable, DoesNotInterpolate) {
  const XYZ2labTable& table = colourTables().xyzToLab;
  EXPECT_EQ(table(0.50004f), table.samples()[4999]);
  EXPECT_EQ(table(0.50006f), table.samples()[5000]);
}

TEST(MonotonicTable, SharesItsSamplesWithItsCopies) {
  const Power table(0.0f, 1.0f, 16, 2.0f);
  const Power copy = table;
  EXPECT_EQ(&copy.samples(), &table.samples());
}

TEST(XYZ2labTable, StartsAtSixteenOver116) {
  EXPECT_EQ(colourTables().xyzToLab(0.0f), 16.0f / 116.0f);
}

TEST(Lab2yTable, EndsAtOne) {
  EXPECT_EQ(colourTables().labToY(100.0f), 1.0f);
}

TEST(SuperQuadric, IsABumpOverItsRange) {
  const SuperQuadric bump(10.0f, 20.0f, 1024, 2.0f);
  EXPECT_EQ(bump(10.0f), 0.0f);
  EXPECT_NEAR(bump(15.0f), 1.0f, 1e-5f);
  EXPECT_NEAR(bump(20.0f), 0.0f, 1e-2f);
  EXPECT_NEAR(bump(12.5f), 0.75f, 2e-3f);
}

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

template <typename Table>
std::string tableFingerprint(const Table& samples) {
  return test_support::fingerprint(samples.data(), samples.size() * sizeof(samples[0]));
}

TEST(ColourTables, AreTheSameOnEveryPlatform) {
  const ColourTables& tables = colourTables();
  EXPECT_EQ(tableFingerprint(tables.linear), "63e3d178534f47ca");
  EXPECT_EQ(tableFingerprint(tables.xyzToLab.samples()), "4dc630c847e9ef86");
  EXPECT_EQ(tableFingerprint(tables.labToXz.samples()), "d1e18bc675290ab9");
  EXPECT_EQ(tableFingerprint(tables.labToY.samples()), "6d3bfb068ec92341");
  EXPECT_EQ(tableFingerprint(tables.skinA.samples()), "8d33dfc885f2ab72");
  EXPECT_EQ(tableFingerprint(tables.skinB.samples()), "d6e9ba942c3a8893");
  EXPECT_EQ(tableFingerprint(tables.flatness.samples()), "6ccaab4f51b2be4b");
  std::array<std::uint8_t, 1024> codes;
  for (int i = 0; i < 1024; ++i) codes[i] = tables.encode((i + 0.5f) / 1023.0f);
  EXPECT_EQ(tableFingerprint(codes), "aa5ea44b55690991");
}

}  // namespace
}  // namespace pelorin::image_processing
