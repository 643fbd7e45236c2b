#include "image_processing/filters/looks/apply_look.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstring>
#include <limits>

#include "image_processing/filters/looks/low_dim_rgb_curve_filter.h"
#include "image_processing/filters/looks/preset_looks.h"
#include "image_processing/filters/looks/vignette_rows.h"
#include "tests/support/instruction_sets.h"
#include "tests/support/looks.h"
#include "tests/support/pictures.h"
#include "tests/support/slow_build.h"

namespace pelorin::image_processing {
namespace {

using test_support::instructionSets;
using test_support::lookOf;
using test_support::maskOf;
using test_support::noisePicture;
using test_support::photoLikePicture;
using test_support::UseInstructionSet;

constexpr float infinity = std::numeric_limits<float>::infinity();
const float nan = std::nanf("");

// One look of each channel mix.
std::vector<Look> looksOfEveryMix(const CubicRadialMask* vignette) {
  return {lookOf<SummerRGBFilter>(vignette), lookOf<ZebraBWFilter>(vignette),
          lookOf<VintageRGBFilter>(vignette)};
}

// A view of pixels that the caller keeps.
Image<RGBA8Pixel> viewOf(std::vector<RGBA8Pixel>& pixels, const Image<RGBA8Pixel>& sizedAs) {
  return {sizedAs.width, sizedAs.height,
          std::shared_ptr<RGBA8Pixel>(pixels.data(), [](RGBA8Pixel*) {})};
}

// The definition and every instruction set into outputs that hold one pixel more, which nobody may
// touch.
testing::AssertionResult equalsScalar(const Look& look, const Image<RGBA8Pixel>& picture) {
  const std::vector<RGBA8Pixel> untouched(picture.pixelCount() + 1, RGBA8Pixel{7, 7, 7, 7});
  std::vector<RGBA8Pixel> expected = untouched;
  Image<RGBA8Pixel> expectedImage = viewOf(expected, picture);
  applyLookScalar(look, picture, expectedImage);
  for (const std::int64_t set : instructionSets(HWY_AVX3_DL)) {
    const UseInstructionSet use(set);
    std::vector<RGBA8Pixel> actual = untouched;
    Image<RGBA8Pixel> actualImage = viewOf(actual, picture);
    applyLook(look, picture, actualImage);
    if (std::memcmp(actual.data(), expected.data(), actual.size() * sizeof(RGBA8Pixel)) != 0) {
      const auto bad = std::mismatch(actual.begin(), actual.end(), expected.begin()).first;
      return testing::AssertionFailure()
             << picture.width << "x" << picture.height << " mix " << static_cast<int>(look.mix)
             << " radius " << look.maskRadius << " alpha " << look.maskAlpha << " on "
             << hwy::TargetName(set) << ": pixel " << bad - actual.begin();
    }
  }
  return testing::AssertionSuccess();
}

// From 400 · 400 pixels on a look without mix goes through tables, below it does not.
constexpr std::uint32_t largeWidth = 401, largeHeight = 403, smallWidth = 37, smallHeight = 29;

// Of the large pictures, which take their time.
bool leftOut(int n) {
  return test_support::slowBuild && n % 5 != 0;
}

TEST(ApplyLook, EqualsTheScalarDefinitionOnEveryGeometry) {
  const CubicRadialMask mask = maskOf<SummerRGBFilter>();
  const std::pair<std::uint32_t, std::uint32_t> sizes[] = {
      {1, 1},     {2, 1},     {1, 2},     {3, 3},     {17, 13},    {255, 3},   {256, 2},
      {257, 5},   {513, 7},   {320, 240}, {400, 400}, {401, 403},  {640, 480}, {481, 642},
      {65500, 1}, {1, 65500}, {65500, 2}, {2, 65500}, {170000, 1}, {1, 170000}};
  for (const auto& [width, height] : sizes) {
    if (test_support::slowBuild && width * height > 200000) continue;
    const Image<RGBA8Pixel> picture = noisePicture(width, height, width);
    for (const Look& look : looksOfEveryMix(&mask)) EXPECT_TRUE(equalsScalar(look, picture));
    for (const Look& look : looksOfEveryMix(nullptr)) EXPECT_TRUE(equalsScalar(look, picture));
  }
}

TEST(ApplyLook, EqualsTheScalarDefinitionOnTwelveMegapixels) {
  const CubicRadialMask mask = maskOf<SummerRGBFilter>();
  const std::uint32_t scale = test_support::slowBuild ? 5 : 1;
  const Image<RGBA8Pixel> picture = photoLikePicture(4000 / scale, 3000 / scale, 1);
  for (const Look& look : looksOfEveryMix(&mask)) EXPECT_TRUE(equalsScalar(look, picture));
}

TEST(ApplyLook, EqualsTheScalarDefinitionForEveryLook) {
  const CubicRadialMask preset = maskOf<SummerRGBFilter>(), plain = maskOf<LowDimRGBCurveFilter>();
  for (const std::uint32_t scale : {1u, 11u}) {
    const Image<RGBA8Pixel> picture = photoLikePicture(41 * scale, 37 * scale, scale);
    for (const CubicRadialMask* mask : {&preset, &plain, static_cast<decltype(&plain)>(nullptr)}) {
      for (const Look& look : {lookOf<ZebraBWFilter>(mask), lookOf<WinterRGBFilter>(mask),
                               lookOf<SpringRGBFilter>(mask), lookOf<FallRGBFilter>(mask),
                               lookOf<SummerRGBFilter>(mask), lookOf<VintageRGBFilter>(mask),
                               lookOf<LowDimRGBCurveFilter>(mask)}) {
        EXPECT_TRUE(equalsScalar(look, picture));
      }
    }
  }
}

TEST(ApplyLook, EqualsTheScalarDefinitionForAnyOpacity) {
  const CubicRadialMask mask = maskOf<SummerRGBFilter>();
  const Image<RGBA8Pixel> large = noisePicture(largeWidth, largeHeight, 1);
  const Image<RGBA8Pixel> small = noisePicture(smallWidth, smallHeight, 2);
  int n = 0;
  for (Look& look : looksOfEveryMix(&mask)) {
    for (const float alpha : {0.0f, -0.0f, 0.3f, 0.999f, 1.0f, 1.0001f, -0.01f, 1.7f, -2.0f, 30.0f,
                              -1e4f, 1e9f, -1e12f, 1e38f, infinity, -infinity, nan}) {
      look.maskAlpha = alpha;
      if (!leftOut(n++)) {
        EXPECT_TRUE(equalsScalar(look, large));
      }
      EXPECT_TRUE(equalsScalar(look, small));
    }
  }
}

TEST(ApplyLook, EqualsTheScalarDefinitionForAnyRadius) {
  const CubicRadialMask mask = maskOf<SummerRGBFilter>();
  const Image<RGBA8Pixel> large = noisePicture(largeWidth, largeHeight, 1);
  const Image<RGBA8Pixel> small = noisePicture(smallWidth, smallHeight, 2);
  int n = 0;
  const Image<RGBA8Pixel> one = noisePicture(1, 1, 3);
  for (Look& look : looksOfEveryMix(&mask)) {
    for (const float radius : {0.0f, -0.0f, 1.0f, -2.28f, 0.01f, 1e-20f, 1e-37f, 1e-40f, 1e-45f,
                               1e20f, 3e38f, infinity, -infinity, nan}) {
      look.maskRadius = radius;
      if (!leftOut(n++)) {
        EXPECT_TRUE(equalsScalar(look, large));
      }
      EXPECT_TRUE(equalsScalar(look, small));
      EXPECT_TRUE(equalsScalar(look, one));
    }
  }
}

TEST(ApplyLook, EqualsTheScalarDefinitionForAnyCurve) {
  const CubicRadialMask mask = maskOf<SummerRGBFilter>();
  const Image<RGBA8Pixel> large = noisePicture(largeWidth, largeHeight, 1);
  const Image<RGBA8Pixel> small = noisePicture(smallWidth, smallHeight, 2);
  int n = 0;
  std::vector<std::vector<float>> curves = {
      {0.0f, 255.0f},         {255.0f, 0.0f},      {-400.0f, 700.0f},
      {-2e6f, 2e6f, 1.0f},    {-1e30f, 1e30f},     {nan, 255.0f},
      {0.0f, infinity, 9.0f}, {-infinity, 255.0f}, {1e6f, -1e6f, 1e6f}};
  for (const std::size_t count : {3u, 11u, 255u, 256u, 257u, 65536u, 65537u, 100000u}) {
    std::vector<float> curve(count);
    for (std::size_t i = 0; i < count; ++i) {
      curve[i] = static_cast<float>(i) * 300.0f / static_cast<float>(count);
    }
    curves.push_back(curve);
  }
  for (const CubicRadialMask* vignette : {&mask, static_cast<decltype(&mask)>(nullptr)}) {
    for (Look& look : looksOfEveryMix(vignette)) {
      for (const std::vector<float>& curve : curves) {
        look.curves[1] = LookCurve(curve);
        if (!leftOut(n++)) {
          EXPECT_TRUE(equalsScalar(look, large)) << curve.size() << " from " << curve[0];
        }
        EXPECT_TRUE(equalsScalar(look, small)) << curve.size() << " from " << curve[0];
      }
    }
  }
}

TEST(ApplyLook, EqualsTheScalarDefinitionForAnyMask) {
  const Image<RGBA8Pixel> large = noisePicture(largeWidth, largeHeight, 1);
  const Image<RGBA8Pixel> small = noisePicture(smallWidth, smallHeight, 2);
  int n = 0;
  const std::pair<float, float> ends[] = {{0.0f, 1.0f},   {1.0f, 0.0f}, {-3.0f, 5.0f},
                                          {0.5f, 0.5f},   {nan, 1.0f},  {infinity, 0.0f},
                                          {1e30f, -1e30f}};
  for (const auto& [edge, centre] : ends) {
    for (const int count : {2, 3, 400}) {
      const CubicRadialMask mask(edge, centre, count);
      for (Look& look : looksOfEveryMix(&mask)) {
        look.maskRadius = 1.2f;
        if (!leftOut(n++)) {
          EXPECT_TRUE(equalsScalar(look, large)) << edge << " " << centre << " " << count;
        }
        EXPECT_TRUE(equalsScalar(look, small)) << edge << " " << centre << " " << count;
      }
    }
  }
}

TEST(ApplyLook, StopsAtTheShorterImageWithTheSourcesCoordinates) {
  const CubicRadialMask mask = maskOf<SummerRGBFilter>();
  for (const auto& [width, height] : {std::pair{30u, 20u}, std::pair{410u, 400u}}) {
    const Image<RGBA8Pixel> picture = photoLikePicture(width, height, 1);
    for (const Look& look : looksOfEveryMix(&mask)) {
      Image<RGBA8Pixel> whole(width, height);
      applyLookScalar(look, picture, whole);
      for (const auto& [otherWidth, otherHeight] :
           {std::pair{width - 7, height}, std::pair{width, height - 1},
            std::pair{width + 9, height}, std::pair{width * height / 2, 1u}, std::pair{0u, 5u}}) {
        Image<RGBA8Pixel> output(otherWidth, otherHeight), scalar(otherWidth, otherHeight);
        output.set({1, 2, 3, 4});
        scalar.set({1, 2, 3, 4});
        applyLook(look, picture, output);
        applyLookScalar(look, picture, scalar);
        ASSERT_EQ(std::memcmp(output.data.get(), scalar.data.get(), output.byteSize()), 0);
        const std::size_t shared = std::min(whole.pixelCount(), output.pixelCount());
        ASSERT_EQ(std::memcmp(output.data.get(), whole.data.get(), shared * 4), 0);
        for (std::size_t i = shared; i < output.pixelCount(); ++i) {
          ASSERT_EQ(output.data.get()[i], (RGBA8Pixel{1, 2, 3, 4}));
        }
      }
    }
  }
}

TEST(ApplyLook, MayWriteOverItsSource) {
  const CubicRadialMask mask = maskOf<SummerRGBFilter>();
  for (const auto& [width, height] : {std::pair{30u, 20u}, std::pair{410u, 400u}}) {
    for (const Look& look : looksOfEveryMix(&mask)) {
      Image<RGBA8Pixel> picture = photoLikePicture(width, height, 1);
      Image<RGBA8Pixel> expected(width, height);
      applyLookScalar(look, picture, expected);
      applyLook(look, picture, picture);
      EXPECT_EQ(std::memcmp(picture.data.get(), expected.data.get(), picture.byteSize()), 0);
    }
  }
}

TEST(ApplyLook, DoesNothingOnAnEmptyImage) {
  const CubicRadialMask mask = maskOf<SummerRGBFilter>();
  for (const auto& [width, height] : {std::pair{0u, 0u}, std::pair{0u, 9u}, std::pair{9u, 0u}}) {
    const Image<RGBA8Pixel> empty(width, height);
    for (const Look& look : looksOfEveryMix(&mask)) EXPECT_TRUE(equalsScalar(look, empty));
    for (const Look& look : looksOfEveryMix(nullptr)) EXPECT_TRUE(equalsScalar(look, empty));
  }
}

// Coordinates of a picture this wide differ between repeated addition and a multiplication.
TEST(VignetteRows, GrowTheirCoordinatesByRepeatedAddition) {
  const VignetteCoordinates coordinates(4000, 3000, 2.3f);
  const CubicRadialMask mask = maskOf<SummerRGBFilter>();
  const VignetteRows rows(coordinates, 4000, 3000, &mask);
  float u = coordinates.firstU, v = coordinates.firstV;
  bool multiplicationDiffers = false;
  for (std::uint32_t i = 0; i < 3000; ++i) {
    ASSERT_EQ(rows.row(i).uSquares[i], u * u) << i;
    ASSERT_EQ(rows.row(i).vSquare, v * v) << i;
    const float product = coordinates.firstU + static_cast<float>(i) * coordinates.step;
    multiplicationDiffers = multiplicationDiffers || product != u;
    u += coordinates.step;
    v += coordinates.step;
  }
  EXPECT_TRUE(multiplicationDiffers);
}

}  // namespace
}  // namespace pelorin::image_processing
