#include "image_processing/autoenhance/enhance_row.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <vector>

#include "tests/support/instruction_sets.h"
#include "tests/support/mask_types.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::onEveryInstructionSet;
using test_support::Quantized;
using test_support::Random;
using test_support::randomPixels;

std::vector<float> wavyCurve(std::size_t samples) {
  std::vector<float> curve(samples);
  for (std::size_t i = 0; i < samples; ++i) {
    const float t = static_cast<float>(i) / static_cast<float>(samples - 1);
    curve[i] = t * t * (3.0f - 2.0f * t);
  }
  return curve;
}

template <typename Mask>
std::vector<Mask> randomMask(std::size_t count, std::uint64_t seed) {
  Random random(seed);
  std::vector<Mask> mask(count);
  for (Mask& value : mask) value = random.nextFloat();
  return mask;
}

template <typename Mask>
void expectTheDefinition(const TonePass& pass, const std::vector<RGBA8Pixel>& in,
                         const Mask* bilateral, const Mask* ltm) {
  std::vector<RGBA8Pixel> expected(in.size() + 1, RGBA8Pixel{1, 2, 3, 4});
  enhanceRowScalar(pass, in.data(), bilateral, ltm, expected.data(), in.size());
  const auto compare = [&] {
    std::vector<RGBA8Pixel> actual(in.size() + 1, RGBA8Pixel{1, 2, 3, 4});
    enhanceRow(pass, in.data(), bilateral, ltm, actual.data(), in.size());
    for (std::size_t i = 0; i < expected.size(); ++i) {
      ASSERT_EQ(actual[i], expected[i]) << "pixel " << i << " of " << in.size();
    }
  };
  if (pass.ordinary) {
    onEveryInstructionSet(compare);
  } else {
    compare();  // no vectors are used at all
  }
}

TEST(TonePass, IsOrdinaryOnlyWhenAllItsNumbersAre) {
  const float infinity = std::numeric_limits<float>::infinity();
  const auto isOrdinary = [](std::size_t samples, float scale, float vibrance, float ltmBlend,
                             float detailGain) {
    return TonePass(wavyCurve(samples), scale, vibrance, ltmBlend, detailGain).ordinary;
  };
  EXPECT_TRUE(isOrdinary(51, 100.0f, 1.5f, 0.6f, 0.5f));
  EXPECT_TRUE(isOrdinary(63, 100.0f, 0.0f, -3.0f, -2.0f));
  EXPECT_FALSE(isOrdinary(64, 100.0f, 1.5f, 0.6f, 0.5f));
  EXPECT_FALSE(isOrdinary(51, 99.0f, 1.5f, 0.6f, 0.5f));
  for (const float vibrance : {-0.5f, 1e6f, infinity, std::nanf("")}) {
    EXPECT_FALSE(isOrdinary(51, 100.0f, vibrance, 0.6f, 0.5f)) << vibrance;
  }
  for (const float odd : {1e6f, -1e6f, infinity, std::nanf("")}) {
    EXPECT_FALSE(isOrdinary(51, 100.0f, 1.5f, odd, 0.5f)) << odd;
    EXPECT_FALSE(isOrdinary(51, 100.0f, 1.5f, 0.6f, odd)) << odd;
    std::vector<float> curve = wavyCurve(51);
    curve[7] = odd;
    EXPECT_FALSE(TonePass(curve, 100.0f, 1.5f, 0.6f, 0.5f).ordinary) << odd;
  }
}

template <typename Mask>
class EnhanceRow : public testing::Test {};
TYPED_TEST_SUITE(EnhanceRow, test_support::MaskTypes);

TYPED_TEST(EnhanceRow, MatchesItsDefinitionAtEveryTailLength) {
  const TonePass pass(wavyCurve(51), 100.0f, 1.5f, 0.6f, 0.5f);
  for (std::size_t count = 0; count <= 70; ++count) {
    const auto in = randomPixels(count, count);
    const auto bilateral = randomMask<TypeParam>(count, 2 * count);
    const auto ltm = randomMask<TypeParam>(count, 3 * count);
    expectTheDefinition<TypeParam>(pass, in, bilateral.data(), ltm.data());
    expectTheDefinition<TypeParam>(pass, in, nullptr, nullptr);
  }
}

TYPED_TEST(EnhanceRow, MatchesItsDefinitionForEverySetting) {
  const std::size_t count = 1500;
  const auto in = randomPixels(count, 1);
  const auto bilateral = randomMask<TypeParam>(count, 2);
  const auto ltm = randomMask<TypeParam>(count, 3);
  const float infinity = std::numeric_limits<float>::infinity();
  const float notANumber = std::nanf("");
  for (const float vibrance : {0.0f, 0.5f, 1.0f, 1.3f, 1.8f, 40.0f, -0.5f, infinity, notANumber}) {
    for (const float ltmBlend : {0.0f, 0.7f, -3.0f, 1e5f, infinity, notANumber}) {
      for (const float detailGain : {0.0f, 1.0f, -2.0f, 1e5f, 1e38f, notANumber}) {
        const TonePass pass(wavyCurve(51), 100.0f, vibrance, ltmBlend, detailGain);
        expectTheDefinition<TypeParam>(pass, in, bilateral.data(), ltm.data());
      }
    }
  }
}

TYPED_TEST(EnhanceRow, MatchesItsDefinitionForEveryCurve) {
  const auto in = randomPixels(700, 4);
  const auto bilateral = randomMask<TypeParam>(700, 5);
  const auto ltm = randomMask<TypeParam>(700, 6);
  for (const std::size_t samples : {2u, 3u, 50u, 51u, 52u, 64u, 65u, 1000u}) {
    for (const float scale : {100.0f, 99.0f, 1.0f}) {
      std::vector<float> curve = wavyCurve(samples);
      expectTheDefinition<TypeParam>(TonePass(curve, scale, 1.2f, 0.5f, 0.2f), in, bilateral.data(),
                                     ltm.data());
      for (float& sample : curve) sample = 3.0f * sample - 1.0f;  // far outside [0, 1]
      expectTheDefinition<TypeParam>(TonePass(curve, scale, 1.2f, 0.5f, 0.2f), in, nullptr,
                                     nullptr);
      curve.back() = std::nanf("");
      expectTheDefinition<TypeParam>(TonePass(curve, scale, 1.2f, 0.5f, 0.2f), in, bilateral.data(),
                                     ltm.data());
    }
  }
}

TEST(EnhanceRowOfFloats, MatchesItsDefinitionForMasksOutsideTheirRange) {
  const auto in = randomPixels(400, 7);
  const auto bilateral = randomMask<float>(400, 8);
  const auto ltm = randomMask<float>(400, 9);
  const TonePass pass(wavyCurve(51), 100.0f, 1.5f, 0.6f, 0.5f);
  const float infinity = std::numeric_limits<float>::infinity();
  for (const float unusual : {-0.0f, -1e-6f, 1.00001f, 1.03f, 5.0f, -7.0f, 300.0f, infinity,
                              -infinity, std::nanf(""), 1e30f}) {
    auto oddBilateral = bilateral, oddLtm = ltm;
    oddBilateral[30] = oddLtm[31] = unusual;
    expectTheDefinition<float>(pass, in, oddBilateral.data(), ltm.data());
    expectTheDefinition<float>(pass, in, bilateral.data(), oddLtm.data());
  }
}

/// The block of 4096 colours from `block` · 4096 on, red in the low byte.
std::vector<RGBA8Pixel> coloursOfBlock(std::uint32_t block) {
  std::vector<RGBA8Pixel> colours(4096);
  for (std::uint32_t i = 0; i < 4096; ++i) {
    const std::uint32_t colour = block * 4096 + i;
    colours[i] = {static_cast<std::uint8_t>(colour), static_cast<std::uint8_t>(colour >> 8),
                  static_cast<std::uint8_t>(colour >> 16), static_cast<std::uint8_t>(i)};
  }
  return colours;
}

// Every so many blocks of colours, of which there are 4096: black, white and a tour of the cube.
TYPED_TEST(EnhanceRow, MatchesItsDefinitionForColoursOfEveryKind) {
  const auto bilateral = randomMask<TypeParam>(4096, 10);
  const auto ltm = randomMask<TypeParam>(4096, 11);
  const TonePass gentle(wavyCurve(51), 100.0f, 0.8f, 0.2f, 0.1f);
  const TonePass strong(wavyCurve(51), 100.0f, 1.4f, 0.55f, 0.4f);
  const std::uint32_t stride = sizeof(void*) == 8 ? 63 : 1365;  // divide 4095: the last is white's
  for (std::uint32_t block = 0; block < 4096; block += stride) {
    const auto colours = coloursOfBlock(block);
    expectTheDefinition<TypeParam>(gentle, colours, bilateral.data(), ltm.data());
    expectTheDefinition<TypeParam>(strong, colours, bilateral.data(), ltm.data());
    expectTheDefinition<TypeParam>(strong, colours, nullptr, nullptr);
  }
}

}  // namespace
}  // namespace pelorin::image_processing
