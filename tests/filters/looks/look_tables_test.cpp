#include "image_processing/filters/looks/look_tables.h"

#include <gtest/gtest.h>

#include <vector>

#include "image_processing/filters/looks/preset_looks.h"
#include "image_processing/filters/looks/soft_light.h"
#include "image_processing/filters/looks/vignette_coordinates.h"
#include "tests/support/instruction_sets.h"
#include "tests/support/looks.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::lookOf;
using test_support::maskOf;
using test_support::onEveryInstructionSet;
using test_support::randomPixels;

constexpr RGBA8Pixel untouched = {7, 7, 7, 7};

LookTable randomTable(std::uint64_t seed) {
  test_support::Random random(seed);
  LookTable table;
  for (auto& channel : table) {
    for (std::uint8_t& entry : channel) entry = static_cast<std::uint8_t>(random.below(256));
  }
  return table;
}

RGBA8Pixel lookUp(const LookTable& table, const RGBA8Pixel& p) {
  return {table[0][p.r], table[1][p.g], table[2][p.b], p.a};
}

TEST(ApplyLookTable, LooksUpEveryChannelOnEveryInstructionSetAtEveryLength) {
  const LookTable table = randomTable(1);
  onEveryInstructionSet(
      [&] {
        for (std::size_t count = 0; count <= 300; ++count) {
          const std::vector<RGBA8Pixel> pixels = randomPixels(count, count);
          std::vector<RGBA8Pixel> expected, actual(count + 1, untouched);
          for (const RGBA8Pixel& p : pixels) expected.push_back(lookUp(table, p));
          expected.push_back(untouched);
          applyLookTable(table, pixels.data(), actual.data(), count);
          ASSERT_TRUE(actual == expected) << count;
        }
      },
      HWY_AVX3_DL);
}

TEST(ApplyLookTables, TakesTheTableOfEachMaskSampleOnEveryInstructionSetAtEveryLength) {
  const CubicRadialMask mask(0.0f, 1.0f, 40);
  std::vector<LookTable> tables;
  for (std::size_t i = 0; i < mask.samples().size(); ++i) tables.push_back(randomTable(i));
  onEveryInstructionSet(
      [&] {
        for (std::uint32_t count = 1; count <= 100; ++count) {
          const VignetteCoordinates coordinates(count, 40, 1.5f);
          const VignetteRows rows(coordinates, count, 40, &mask);
          const std::vector<RGBA8Pixel> pixels = randomPixels(count, count);
          std::vector<RGBA8Pixel> expected, actual(count + 1, untouched);
          const float v = coordinates.firstV;
          float u = coordinates.firstU;
          for (const RGBA8Pixel& p : pixels) {
            expected.push_back(lookUp(tables[mask.indexOf(u * u + v * v)], p));
            u += coordinates.step;
          }
          expected.push_back(untouched);
          applyLookTables(tables.data(), rows.row(0), pixels.data(), actual.data(), count);
          ASSERT_TRUE(actual == expected) << count;
        }
      },
      HWY_AVX3_DL);
}

// Opacities in 0 ... 1 are filled by vectors, others by the scalar functions.
TEST(LookTables, HoldTheScalarDefinitionOnEveryInstructionSet) {
  const CubicRadialMask preset = maskOf<SummerRGBFilter>(), two(0.2f, 0.9f, 2);
  onEveryInstructionSet([&] {
    for (const CubicRadialMask* mask : {&preset, &two}) {
      Look look = lookOf<SummerRGBFilter>(mask);
      for (const float opacity : {0.0f, 0.3f, 1.0f, 1.5f}) {
        look.maskAlpha = opacity;
        const std::vector<LookTable> tables = lookTables(look);
        ASSERT_EQ(tables.size(), mask->samples().size());
        for (std::size_t i = 0; i < tables.size(); ++i) {
          for (int value = 0; value < 256; ++value) {
            const float x = vignetteChannel(static_cast<float>(value), mask->samples()[i], opacity);
            for (int c = 0; c < 3; ++c) {
              ASSERT_EQ(tables[i][c][value], look.curves[c](x))
                  << "sample " << i << " channel " << c << " value " << value;
            }
          }
        }
      }
    }
    const Look plain = lookOf<SummerRGBFilter>(nullptr);
    const LookTable table = lookTable(plain);
    for (int value = 0; value < 256; ++value) {
      for (int c = 0; c < 3; ++c) {
        ASSERT_EQ(table[c][value], plain.curves[c](static_cast<float>(value)));
      }
    }
  });
}

}  // namespace
}  // namespace pelorin::image_processing
