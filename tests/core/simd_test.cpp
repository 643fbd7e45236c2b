#include <gtest/gtest.h>

#include <algorithm>
#include <bit>
#include <cmath>
#include <cstdint>

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "tests/core/simd_test.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include "image_processing/core/simd.h"
#include "tests/support/instruction_sets.h"
#include "tests/support/slow_build.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
namespace hn = hwy::HWY_NAMESPACE;

/// How many of the `count` floats from `first` on have another quotient than a division gives.
std::size_t wrongQuotients(float divisor, float first, std::uint32_t count) {
  const hn::ScalableTag<float> floats;
  const hn::RebindToUnsigned<decltype(floats)> words;
#if !HWY_NATIVE_FMA
  count = std::min(count, 1u << 16);  // this is the division itself
#endif
  const auto firstBits = std::bit_cast<std::uint32_t>(first);
  std::size_t wrong = 0;
  for (std::uint32_t i = 0; i < count; i += hn::Lanes(floats)) {
    const auto bits = hn::Iota(words, firstBits + i);
    const auto a = hn::BitCast(floats, bits);
    const auto quotient = simd::divide(a, simd::Divisor(divisor));
    const auto expected = simd::divide(a, hn::Set(floats, divisor));
    wrong +=
        hn::CountTrue(words, hn::Ne(hn::BitCast(words, quotient), hn::BitCast(words, expected)));
  }
  return wrong;
}

/// How many of the roots of 0, 1/256 ... 255 differ from those of the C library.
std::size_t wrongRoots() {
  const hn::ScalableTag<float> floats;
  std::size_t wrong = 0;
  for (int i = 0; i < 255 * 256; ++i) {
    const float x = static_cast<float>(i) / 256.0f;
    wrong += hn::GetLane(simd::squareRoot(hn::Set(floats, x))) != std::sqrt(x);
  }
  return wrong;
}

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
namespace pelorin::image_processing {
namespace {
HWY_EXPORT(wrongQuotients);
HWY_EXPORT(wrongRoots);

// The constants that kernels divide by. Every step scales with powers of two, so that one exponent
// stands for all.
TEST(DivideByAConstant, IsTheDivisionForEveryMantissa) {
  constexpr std::uint32_t mantissas = 1u << (test_support::slowBuild ? 19 : 23);
  test_support::onEveryInstructionSet([] {
    for (const float divisor : {116.0f, 200.0f, 255.0f, 500.0f, 903.3f}) {
      EXPECT_EQ(HWY_DYNAMIC_DISPATCH(wrongQuotients)(divisor, 1.0f, mantissas), 0u) << divisor;
    }
  });
}

TEST(DivideByAConstant, IsTheDivisionAtTheEndsOfItsRange) {
  test_support::onEveryInstructionSet([] {
    for (const float first : {0x1p-60f, -0x1p-60f, 0x1p60f}) {
      EXPECT_EQ(HWY_DYNAMIC_DISPATCH(wrongQuotients)(500.0f, first, 1u << 16), 0u) << first;
    }
  });
}

TEST(SquareRoot, IsTheCLibrarys) {
  test_support::onEveryInstructionSet([] { EXPECT_EQ(HWY_DYNAMIC_DISPATCH(wrongRoots)(), 0u); });
}

}  // namespace
}  // namespace pelorin::image_processing
#endif
