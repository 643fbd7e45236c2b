#include <gtest/gtest.h>
#include <lcms2.h>

#include "tests/support/jpeg_files.h"
#include "tests/support/print_profile.h"

namespace pelorin::photo {
namespace {

using test_support::Bytes;
using test_support::JpegRecipe;
using test_support::makeJpeg;
using test_support::profileOfSwappedInks;

struct Colour {
  int r, g, b;
};

// The colour of a file of one ink mixture; `stored` are the bytes in the file.
Colour decodedColour(JpegRecipe recipe, const Bytes& stored) {
  recipe.samples = JCS_CMYK;
  recipe.quality = 100;
  recipe.width = recipe.height = 16;
  Bytes pixels;
  for (int i = 0; i < 256; ++i) pixels.insert(pixels.end(), stored.begin(), stored.end());
  const DecodedPicture picture = decodeJpeg(makeJpeg(recipe, pixels));
  for (int i = 0; i < 256; ++i) EXPECT_EQ(picture.pixels.get()[i * 4 + 3], 255);
  const std::uint8_t* p = picture.pixels.get() + (5 * 16 + 5) * 4;
  return {p[0], p[1], p[2]};
}

void expectNear(const Colour& actual, const Colour& expected, int tolerance) {
  EXPECT_NEAR(actual.r, expected.r, tolerance);
  EXPECT_NEAR(actual.g, expected.g, tolerance);
  EXPECT_NEAR(actual.b, expected.b, tolerance);
}

TEST(DecodeCmyk, WithoutAnAdobeSegmentTakes255AsFullInk) {
  const JpegRecipe plain = {.stored = JCS_CMYK, .adobe = false};
  expectNear(decodedColour(plain, {0, 0, 0, 0}), {255, 255, 255}, 0);
  expectNear(decodedColour(plain, {255, 0, 0, 0}), {0, 255, 255}, 2);
  expectNear(decodedColour(plain, {0, 0, 255, 127}), {128, 128, 0}, 2);
  expectNear(decodedColour(plain, {0, 0, 0, 255}), {0, 0, 0}, 0);
}

TEST(DecodeCmyk, WithAnAdobeSegmentTakes255AsNoInk) {
  const JpegRecipe adobe = {.stored = JCS_CMYK, .adobe = true};
  expectNear(decodedColour(adobe, {255, 255, 255, 255}), {255, 255, 255}, 0);
  expectNear(decodedColour(adobe, {0, 255, 255, 255}), {0, 255, 255}, 2);
  expectNear(decodedColour(adobe, {255, 255, 0, 128}), {128, 128, 0}, 2);
  expectNear(decodedColour(adobe, {255, 255, 255, 0}), {0, 0, 0}, 0);
}

TEST(DecodeCmyk, ReadsYcckAsTheInksItWasMadeOf) {
  const JpegRecipe ycck = {.stored = JCS_YCCK};
  expectNear(decodedColour(ycck, {255, 255, 255, 255}), {255, 255, 255}, 1);
  expectNear(decodedColour(ycck, {0, 255, 255, 255}), {0, 255, 255}, 3);
  expectNear(decodedColour(ycck, {200, 100, 50, 128}), {100, 50, 25}, 3);
}

TEST(DecodeCmyk, KeepsEveryScaleInItsColours) {
  Bytes pixels;
  for (int i = 0; i < 40 * 24; ++i) pixels.insert(pixels.end(), {200, 100, 50, 128});
  const Bytes file = makeJpeg(
      {.width = 40, .height = 24, .samples = JCS_CMYK, .stored = JCS_YCCK, .quality = 100}, pixels);
  for (const int scale : {1, 2, 4, 8}) {
    const DecodedPicture picture = decodeJpeg(file, scale);
    EXPECT_EQ(picture.width, 40u / static_cast<unsigned>(scale));
    const std::uint8_t* last =
        picture.pixels.get() + (std::size_t{picture.width} * picture.height - 1) * 4;
    expectNear({last[0], last[1], last[2]}, {100, 50, 25}, 3);
    EXPECT_EQ(last[3], 255);
  }
}

TEST(DecodeCmyk, FollowsTheProfileInTheFile) {
  const Bytes profile = profileOfSwappedInks();
  for (const bool adobe : {false, true}) {
    const JpegRecipe recipe = {.stored = JCS_CMYK, .adobe = adobe, .profile = profile};
    const std::uint8_t full = adobe ? 0 : 255, none = adobe ? 255 : 0;
    expectNear(decodedColour(recipe, {none, none, none, none}), {255, 255, 255}, 2);
    expectNear(decodedColour(recipe, {full, none, none, none}), {255, 255, 0}, 6);
    expectNear(decodedColour(recipe, {none, full, none, none}), {255, 0, 255}, 6);
    expectNear(decodedColour(recipe, {none, none, full, none}), {0, 255, 255}, 6);
    expectNear(decodedColour(recipe, {none, none, none, full}), {0, 0, 0}, 2);
  }
}

TEST(DecodeCmyk, IgnoresAProfileThatIsBrokenOrForOtherChannels) {
  cmsUInt32Number size = 0;
  const cmsHPROFILE srgb = cmsCreate_sRGBProfile();
  cmsSaveProfileToMem(srgb, nullptr, &size);
  Bytes colour(size);
  cmsSaveProfileToMem(srgb, colour.data(), &size);
  cmsCloseProfile(srgb);
  Bytes cut = profileOfSwappedInks();
  cut.resize(cut.size() / 2);
  for (const Bytes& profile : {Bytes(3, 1), colour, cut}) {
    const JpegRecipe recipe = {.stored = JCS_CMYK, .adobe = false, .profile = profile};
    expectNear(decodedColour(recipe, {255, 0, 0, 0}), {0, 255, 255}, 2);
  }
}

TEST(DecodeCmyk, MayBeProgressive) {
  const JpegRecipe recipe = {.stored = JCS_YCCK,
                             .scans = test_support::completeProgressiveScans(4)};
  expectNear(decodedColour(recipe, {200, 100, 50, 128}), {100, 50, 25}, 3);
}

}  // namespace
}  // namespace pelorin::photo
