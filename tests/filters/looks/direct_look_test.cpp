#include "image_processing/filters/looks/direct_look.h"

#include <gtest/gtest.h>

#include <cstring>
#include <vector>

#include "image_processing/filters/looks/apply_look.h"
#include "image_processing/filters/looks/preset_looks.h"
#include "image_processing/filters/looks/vignette_coordinates.h"
#include "image_processing/filters/looks/vignette_rows.h"
#include "tests/support/instruction_sets.h"
#include "tests/support/looks.h"
#include "tests/support/pictures.h"
#include "tests/support/slow_build.h"

namespace pelorin::image_processing {
namespace {

using test_support::lookOf;
using test_support::maskOf;
using test_support::noisePicture;
using test_support::onEveryInstructionSet;

// One look of each mix that may be computed directly: without a mix only with a vignette.
std::vector<Look> directLooks(const CubicRadialMask& vignette) {
  return {lookOf<SummerRGBFilter>(&vignette), lookOf<ZebraBWFilter>(&vignette),
          lookOf<VintageRGBFilter>(&vignette), lookOf<ZebraBWFilter>(nullptr),
          lookOf<VintageRGBFilter>(nullptr)};
}

// The first row of `picture`, into pixels of which one more must stay as it was.
std::vector<RGBA8Pixel> firstRow(const Look& look, const Image<RGBA8Pixel>& picture) {
  std::vector<RGBA8Pixel> row(picture.width + 1, RGBA8Pixel{7, 7, 7, 7});
  const VignetteCoordinates coordinates(picture.width, picture.height, look.maskRadius);
  const VignetteRows rows(coordinates, picture.width, 1, look.vignette);
  applyDirectLook(DirectLook(look), look.vignette ? rows.row(0) : VignetteRow{}, picture.data.get(),
                  row.data(), picture.width);
  return row;
}

std::vector<RGBA8Pixel> firstRowScalar(const Look& look, const Image<RGBA8Pixel>& picture) {
  std::vector<RGBA8Pixel> row(picture.width + 1, RGBA8Pixel{7, 7, 7, 7});
  Image<RGBA8Pixel> output(picture.width, 1,
                           std::shared_ptr<RGBA8Pixel>(row.data(), [](RGBA8Pixel*) {}));
  applyLookScalar(look, picture, output);
  return row;
}

void expectSameRow(const Look& look, const Image<RGBA8Pixel>& picture) {
  ASSERT_TRUE(DirectLook::canCompute(look));
  ASSERT_TRUE(firstRow(look, picture) == firstRowScalar(look, picture))
      << picture.width << " pixels, mix " << static_cast<int>(look.mix) << ", opacity "
      << look.maskAlpha << ", " << look.curves[1].samples().size() << " samples";
}

TEST(DirectLook, EqualsTheScalarDefinitionOnEveryInstructionSetAtEveryLength) {
  const CubicRadialMask mask = maskOf<SummerRGBFilter>();
  onEveryInstructionSet([&] {
    for (std::uint32_t width = 1; width <= 100; ++width) {
      const Image<RGBA8Pixel> picture = noisePicture(width, 3, width);
      for (const Look& look : directLooks(mask)) expectSameRow(look, picture);
    }
  });
}

// Masks on either side of 0.5 and around it, one for each vector and mixed within one.
TEST(DirectLook, EqualsTheScalarDefinitionOnEveryInstructionSetAtEveryOpacityAndMask) {
  const Image<RGBA8Pixel> picture = noisePicture(517, 200, 1);
  onEveryInstructionSet([&] {
    for (const auto& [edge, centre] :
         {std::pair{22.0f / 255.0f, 163.0f / 255.0f}, std::pair{0.0f, 1.0f}, std::pair{1.0f, 0.0f},
          std::pair{0.5f, 0.5f}, std::pair{0.49f, 0.51f}, std::pair{1.0f, 1.0f}}) {
      const CubicRadialMask mask(edge, centre, 400);
      for (Look look : directLooks(mask)) {
        for (const float opacity : {0.0f, 0.3f, 0.999f, 1.0f}) {
          for (const float radius : {0.7f, 8.0f}) {
            look.maskAlpha = opacity;
            look.maskRadius = radius;
            expectSameRow(look, picture);
          }
        }
      }
    }
  });
}

// 63 samples fit in registers, 64 do not; values above 255 keep their low 8 bits, below 0 none.
TEST(DirectLook, EqualsTheScalarDefinitionOnEveryInstructionSetForCurvesOfAnyLength) {
  const CubicRadialMask mask = maskOf<SummerRGBFilter>();
  const Image<RGBA8Pixel> picture = noisePicture(517, 3, 1);
  onEveryInstructionSet([&] {
    for (const std::size_t count :
         {2u, 3u, 16u, 17u, 32u, 51u, 52u, 62u, 63u, 64u, 65u, 256u, 65535u, 65536u}) {
      std::vector<float> curve(count);
      for (std::size_t i = 0; i < count; ++i) {
        curve[i] = -100.0f + static_cast<float>(i * 7 % count) * 700.0f / static_cast<float>(count);
      }
      for (Look look : directLooks(mask)) {
        look.curves[1] = LookCurve(curve);
        expectSameRow(look, picture);
        look.curves = {LookCurve(curve), LookCurve(curve), LookCurve(curve)};
        expectSameRow(look, picture);
      }
    }
  });
}

// Without a vignette a look is a function of the colour, so all of them can be tried; a thousandth
// of them in a slow build.
TEST(DirectLook, EqualsTheScalarDefinitionOnEveryColour) {
  const std::uint32_t step = test_support::slowBuild ? 1009 : 1;
  Image<RGBA8Pixel> colours((1u << 24) / step, 1);
  for (std::uint32_t i = 0; i < colours.width; ++i) {
    const std::uint32_t colour = i * step;
    colours.data.get()[i] = {static_cast<std::uint8_t>(colour),
                             static_cast<std::uint8_t>(colour >> 8),
                             static_cast<std::uint8_t>(colour >> 16), 255};
  }
  for (const Look& look : {lookOf<ZebraBWFilter>(nullptr), lookOf<VintageRGBFilter>(nullptr)}) {
    const std::vector<RGBA8Pixel> expected = firstRowScalar(look, colours);
    onEveryInstructionSet([&] {
      const std::vector<RGBA8Pixel> actual = firstRow(look, colours);
      ASSERT_EQ(std::memcmp(actual.data(), expected.data(), actual.size() * sizeof actual[0]), 0);
    });
  }
}

}  // namespace
}  // namespace pelorin::image_processing
