#include <gtest/gtest.h>

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "tests/autoenhance/colour/vibrance_simd_test.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include <algorithm>
#include <array>
#include <cstdint>

#include "image_processing/autoenhance/colour/vibrance.h"
#include "image_processing/autoenhance/colour/vibrance_simd.h"
#include "tests/support/instruction_sets.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
namespace hn = hwy::HWY_NAMESPACE;

/// Vibrance on 16 colours.
void vibranceOf16(float amount, float* red, float* green, float* blue) {
  const hn::CappedTag<float, 16> floats;
  for (std::size_t i = 0; i < 16; i += hn::Lanes(floats)) {
    auto r = hn::LoadU(floats, red + i), g = hn::LoadU(floats, green + i),
         b = hn::LoadU(floats, blue + i);
    vibranceInRGB(amount, r, g, b);
    hn::StoreU(r, floats, red + i);
    hn::StoreU(g, floats, green + i);
    hn::StoreU(b, floats, blue + i);
  }
}

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
namespace pelorin::image_processing {
namespace {
HWY_EXPORT(vibranceOf16);

/// Compares 16 colours that differ in blue.
void expectTheDefinition(float amount, int r, int g, const std::array<int, 16>& blues) {
  float reds[16], greens[16], blueFloats[16];
  for (int i = 0; i < 16; ++i) {
    reds[i] = static_cast<float>(r);
    greens[i] = static_cast<float>(g);
    blueFloats[i] = static_cast<float>(blues[i]);
  }
  HWY_DYNAMIC_DISPATCH(vibranceOf16)(amount, reds, greens, blueFloats);
  for (int i = 0; i < 16; ++i) {
    auto red = static_cast<std::uint8_t>(r), green = static_cast<std::uint8_t>(g),
         blue = static_cast<std::uint8_t>(blues[i]);
    vibranceInRGB(amount, red, green, blue);
    ASSERT_EQ(static_cast<int>(reds[i]), red)
        << amount << ": " << r << ", " << g << ", " << blues[i];
    ASSERT_EQ(static_cast<int>(greens[i]), green);
    ASSERT_EQ(static_cast<int>(blueFloats[i]), blue);
  }
}

constexpr std::array amounts = {0.0f, 0.5f, 1.0f, 1.0001f, 1.3f, 1.8f, 40.0f, 999999.0f};

TEST(VibranceVectors, MatchTheDefinitionForColoursFarApart) {
  std::array<int, 16> blues;
  for (int i = 0; i < 16; ++i) blues[i] = 17 * i;  // 0 ... 255
  test_support::onEveryInstructionSet([&] {
    for (const float amount : amounts) {
      for (int r = 0; r < 256; r += 15) {
        for (int g = 0; g < 256; g += 3) expectTheDefinition(amount, r, g, blues);
      }
    }
  });
}

// Where little separates the channels: the skin's fade, the smallest divisors, grey itself.
TEST(VibranceVectors, MatchTheDefinitionForColoursCloseToGrey) {
  test_support::onEveryInstructionSet([&] {
    for (const float amount : amounts) {
      for (int grey = 0; grey < 256; ++grey) {
        std::array<int, 16> blues;
        for (int i = 0; i < 16; ++i) blues[i] = std::clamp(grey + i - 8, 0, 255);
        for (int r = std::max(grey - 7, 0); r <= std::min(grey + 7, 255); ++r) {
          expectTheDefinition(amount, r, grey, blues);
        }
      }
    }
  });
}

}  // namespace
}  // namespace pelorin::image_processing
#endif
