#include "image_processing/core/monotonic_table.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <limits>

namespace pelorin::image_processing {
namespace {

/// Its samples are their own arguments.
class Identity : public MonotonicTable<float> {
 public:
  Identity(float lo, float hi, std::int32_t count) : MonotonicTable(lo, hi, count) { initTable(); }
  float f(float x) const override { return x; }
};

TEST(MonotonicTable, GivesTheLastSampleAtTheTopOfTheUnitRange) {
  for (const std::int32_t count : {2, 400, 1000, 10000}) {
    const Identity table(0.0f, 1.0f, count);
    EXPECT_EQ(table.indexOf(1.0f), count - 1);
    EXPECT_EQ(table(1.0f), table.samples().back());
  }
}

TEST(MonotonicTable, KeepsWhatFloatArithmeticGivesAtTheTopOfOtherRanges) {
  // 60 · (1023 / 60) falls just below 1023 in float.
  EXPECT_EQ(Identity(-10.0f, 50.0f, 1024).indexOf(50.0f), 1022);
}

TEST(MonotonicTable, TakesTheFirstSampleBelowTheRange) {
  const Identity table(0.0f, 1.0f, 10000);
  EXPECT_EQ(table.indexOf(-1e-6f), 0);  // truncated to 0 before the clamp
  EXPECT_EQ(table.indexOf(-5.0f), 0);
  EXPECT_EQ(table.indexOf(-std::numeric_limits<float>::infinity()), 0);
  EXPECT_EQ(table.indexOf(std::nanf("")), 0);
}

TEST(MonotonicTable, TakesTheLastSampleAboveTheRange) {
  const Identity table(0.0f, 1.0f, 10000);
  EXPECT_EQ(table.indexOf(1.5f), 9999);
  EXPECT_EQ(table.indexOf(1e30f), 9999);
  EXPECT_EQ(table.indexOf(std::numeric_limits<float>::infinity()), 9999);
}

TEST(MonotonicTable, DoesNotInterpolate) {
  const Identity table(0.0f, 1.0f, 10000);
  EXPECT_EQ(table(0.50004f), table.samples()[4999]);
  EXPECT_EQ(table(0.50006f), table.samples()[5000]);
}

TEST(MonotonicTable, SharesItsSamplesWithItsCopies) {
  const Identity table(0.0f, 1.0f, 16);
  const Identity copy = table;
  EXPECT_EQ(&copy.samples(), &table.samples());
}

}  // namespace
}  // namespace pelorin::image_processing
