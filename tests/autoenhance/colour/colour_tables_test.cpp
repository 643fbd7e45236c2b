#include "image_processing/autoenhance/colour/colour_tables.h"

#include <gtest/gtest.h>

#include <array>
#include <cstdint>
#include <string>

#include "tests/support/fingerprint.h"

namespace pelorin::image_processing {
namespace {

template <typename Table>
std::string tableFingerprint(const Table& samples) {
  return test_support::fingerprint(samples.data(), samples.size() * sizeof(samples[0]));
}

TEST(ColourTables, GiveTheirLastSampleAtTheTop) {
  const ColourTables& tables = colourTables();
  EXPECT_EQ(tables.xyzToLab(1.0f), tables.xyzToLab.samples().back());
  EXPECT_EQ(tables.labToXz(1.0f), tables.labToXz.samples().back());
  EXPECT_EQ(tables.labToY(100.0f), tables.labToY.samples().back());
  EXPECT_EQ(tables.skinA.indexOf(50.0f), 1022);  // as float arithmetic gives it
  EXPECT_EQ(tables.flatness(1.0f), tables.flatness.samples().back());
}

TEST(ColourTables, AreTheSameOnEveryPlatform) {
  const ColourTables& tables = colourTables();
  EXPECT_EQ(tableFingerprint(sRGBToLinearTable), "63e3d178534f47ca");
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
