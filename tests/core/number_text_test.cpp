#include "image_processing/core/number_text.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdlib>
#include <limits>

namespace pelorin::image_processing {
namespace {

TEST(ShortestText, IsWhatAPersonWouldWrite) {
  EXPECT_EQ(shortestText(0), "0");
  EXPECT_EQ(shortestText(-0.0), "-0");
  EXPECT_EQ(shortestText(1), "1");
  EXPECT_EQ(shortestText(0.4), "0.4");
  EXPECT_EQ(shortestText(-12.75), "-12.75");
  EXPECT_EQ(shortestText(100000), "100000");
  EXPECT_EQ(shortestText(0.0001), "0.0001");
  EXPECT_EQ(shortestText(0.1f), "0.10000000149011612");
}

TEST(ShortestText, HasAnExponentForTheVeryLargeAndTheVerySmall) {
  EXPECT_EQ(shortestText(9999999999999998), "9999999999999998");
  EXPECT_EQ(shortestText(1e16), "1e+16");
  EXPECT_EQ(shortestText(-1.5e300), "-1.5e+300");
  EXPECT_EQ(shortestText(0.00001), "1e-05");
  EXPECT_EQ(shortestText(std::numeric_limits<double>::denorm_min()), "5e-324");
}

TEST(ShortestText, NamesWhatIsNoNumber) {
  EXPECT_EQ(shortestText(INFINITY), "inf");
  EXPECT_EQ(shortestText(-INFINITY), "-inf");
  EXPECT_EQ(shortestText(std::numeric_limits<double>::quiet_NaN()), "nan");
}

TEST(ShortestText, ReadsAsTheSameNumber) {
  for (double value = 1e-9; value < 1e20; value *= 1.7) {
    EXPECT_EQ(std::strtod(shortestText(value).c_str(), nullptr), value) << shortestText(value);
    EXPECT_EQ(std::strtod(shortestText(-1 / value).c_str(), nullptr), -1 / value);
  }
}

TEST(RoundedText, HasSoManyDigitsAndNoZerosBehindThem) {
  EXPECT_EQ(roundedText(1.0 / 3, 9), "0.333333333");
  EXPECT_EQ(roundedText(1 - 0.4, 9), "0.6");
  EXPECT_EQ(roundedText(0.1f, 7), "0.1");
  EXPECT_EQ(roundedText(1234567, 6), "1.23457e+06");
}

TEST(PaddedText, IsSoLongAtLeast) {
  EXPECT_EQ(paddedText(7, 2), "07");
  EXPECT_EQ(paddedText(2026, 4), "2026");
  EXPECT_EQ(paddedText(12345, 4), "12345");
  EXPECT_EQ(paddedText(-1, 4), "-001");
}

}  // namespace
}  // namespace pelorin::image_processing
