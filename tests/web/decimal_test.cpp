// Numbers as a module for browsers reads and writes them, beside this machine's C library.
#include "cmake/toolchains/wasm/decimal.h"

#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <limits>
#include <random>
#include <string>
#include <vector>

namespace wasm {
namespace {

void expectSameReading(const std::string& text) {
  char* end = nullptr;
  char* ownEnd = nullptr;
  const double expected = std::strtod(text.c_str(), &end);
  const double number = readNumber(text.c_str(), &ownEnd, doublePrecision);
  const float single = static_cast<float>(readNumber(text.c_str(), nullptr, floatPrecision));
  EXPECT_EQ(ownEnd, end) << text;
  if (std::isnan(expected)) {
    EXPECT_TRUE(std::isnan(number)) << text;
    return;
  }
  EXPECT_EQ(std::bit_cast<std::uint64_t>(number), std::bit_cast<std::uint64_t>(expected)) << text;
  EXPECT_EQ(single, std::strtof(text.c_str(), nullptr)) << text;
}

void expectSameWriting(double value) {
  std::vector<char> expected(600);
  for (const int precision : {0, 1, 2, 6, 15, 16, 17, 40}) {
    for (const auto& [style, format] :
         {std::pair(Style::fixed, "%.*f"), {Style::scientific, "%.*e"}, {Style::general, "%.*g"}}) {
      std::snprintf(expected.data(), expected.size(), format, precision, value);
      EXPECT_EQ(writeNumber(value, style, precision), expected.data())
          << format << " " << precision;
    }
  }
}

// As many digits as two neighbouring numbers need to tell what lies in the middle.
std::string written(long double value) {
  std::vector<char> text(900);
  std::snprintf(text.data(), text.size(), "%.800Lg", value);
  return text.data();
}

TEST(Decimal, ReadsTextsAsTheCLibraryDoes) {
  for (const char* text : {"",
                           "-",
                           "+.",
                           "--1",
                           "0",
                           "-0",
                           "+1",
                           " \t\n12",
                           "1 ",
                           "0.4abc",
                           "0,4",
                           "5.",
                           ".5",
                           "1.5.5",
                           "1e",
                           "1e+",
                           "1e-5x",
                           "e5",
                           "1e99999999999",
                           "0e99999999999",
                           "-1e-99999999999",
                           "inf",
                           "-INFINITY",
                           "infinite",
                           "nan",
                           "NaN(12_a)",
                           "nan(",
                           "nan(;)",
                           "0x10",
                           "0x",
                           "0xg",
                           "0x.p1",
                           "0x.8",
                           "-0X1.8P3",
                           "0x1p-1075",
                           "0x1.8p-1075",
                           "0x1.00000000000008p0",
                           "0x1.000000000000080000000001p0",
                           "0x123456789abcdef123456789p-30",
                           "0x1p1024",
                           "9007199254740993",
                           "9007199254740993.00000000000000000000001",
                           "2.4703282292062327e-324",
                           "2.4703282292062328e-324",
                           "1.7976931348623157e308",
                           "1.7976931348623159e308",
                           "340282356779733661637539395458142568447.99",
                           "340282356779733661637539395458142568448"}) {
    expectSameReading(text);
  }
  const std::string zeros(3000, '0');
  for (const std::string& text :
       {"0." + zeros + "1", "1" + zeros + "e-3000", "0." + zeros + "1e3001",
        "9007199254740993." + zeros + "1", "9007199254740993." + zeros}) {
    expectSameReading(text);
  }
}

TEST(Decimal, ReadsAnyNumberAndWhatLiesBetweenTwo) {
  std::mt19937_64 random(1);
  for (int i = 0; i < 120; ++i) {
    const auto value = std::bit_cast<double>(random());
    const auto single = std::bit_cast<float>(static_cast<std::uint32_t>(random()));
    if (!std::isfinite(value) || !std::isfinite(single)) continue;
    expectSameReading(writeNumber(value, Style::general, 1 + i % 17));
    const double next = std::nextafter(value, INFINITY);
    if (sizeof(long double) > sizeof(double))
      expectSameReading(written((0.5L * value) + 0.5L * next));
    expectSameReading(written(0.5 * single + 0.5 * std::nextafter(single, INFINITY)));
  }
}

TEST(Decimal, WritesAsTheCLibraryDoes) {
  for (const double value : {0.0,
                             -0.0,
                             0.5,
                             1.5,
                             2.5,
                             9.5,
                             99.5,
                             0.05,
                             0.25,
                             0.125,
                             9.99999e-5,
                             999999.5,
                             1e15,
                             1e16,
                             1e17,
                             0.0001,
                             0.00001,
                             5e-324,
                             1.7976931348623157e308,
                             HUGE_VAL,
                             -HUGE_VAL,
                             std::nan("")}) {
    expectSameWriting(value);
  }
  std::mt19937_64 random(1);
  for (int i = 0; i < 12; ++i) {
    expectSameWriting(static_cast<double>(random() % 2'000'001) / 1024 - 1000);
    const auto value = std::bit_cast<double>(random());
    if (std::abs(value) < 1e200) expectSameWriting(value);
  }
}

}  // namespace
}  // namespace wasm
