#include "image_processing/autoenhance/lab_tone_pass.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <string>
#include <vector>

#include "image_processing/autoenhance/colour/lab.h"
#include "image_processing/autoenhance/colour/vibrance.h"
#include "image_processing/core/sampled_curve.h"
#include "tests/support/curves.h"
#include "tests/support/fingerprint.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::fingerprint;
using test_support::flatPicture;
using test_support::identityCurve;
using test_support::noisePicture;
using test_support::photoLikePicture;

FilterConfig withoutMasks() {
  FilterConfig config = defaultFilterConfigValue;
  config.detailGainHigh = 0.0f;
  return config;
}

TEST(LabTonePass, ComesBackWithinTheTablesAtTheNeutralSetting) {
  const auto photo = photoLikePicture(64, 64, 2);
  Image<RGBA8Pixel> output(64, 64);
  imageVibranceLabAndToneCurve(photo, output, withoutMasks(), identityCurve(), 100.0f,
                               ImageMasks<float, float>{});
  long sum = 0;
  for (std::size_t i = 0; i < photo.pixelCount(); ++i) {
    const RGBA8Pixel& in = photo.data.get()[i];
    const RGBA8Pixel& out = output.data.get()[i];
    ASSERT_LE(std::abs(in.g - out.g), 18);
    sum += std::abs(in.r - out.r) + std::abs(in.g - out.g) + std::abs(in.b - out.b);
  }
  EXPECT_LT(static_cast<double>(sum) / (3 * photo.pixelCount()), 1.5);
}

TEST(LabTonePass, CopiesAlphaInEveryCase) {
  const auto photo = noisePicture(40, 30, 3);
  ImageMasks<float, float> masks;
  computeImageMasks(photo, {}, defaultFilterConfigValue, masks);
  for (const FilterConfig& config : {withoutMasks(), defaultFilterConfigValue}) {
    Image<RGBA8Pixel> output(40, 30);
    imageVibranceLabAndToneCurve(photo, output, config, identityCurve(), 100.0f, masks);
    for (std::size_t i = 0; i < photo.pixelCount(); ++i) {
      ASSERT_EQ(output.data.get()[i].a, photo.data.get()[i].a);
    }
  }
}

TEST(LabTonePass, ClampsLightnessOnlyWithMasks) {
  // A huge detail gain drives L' far outside; clamped, a grey pixel ends black or white.
  const auto photo = noisePicture(32, 32, 4);
  ImageMasks<float, float> masks;
  computeImageMasks(photo, {}, defaultFilterConfigValue, masks);
  masks.ltmMask->set(0.0f);
  FilterConfig config = defaultFilterConfigValue;
  config.detailGain = 1e6f;
  Image<RGBA8Pixel> output(32, 32);
  imageVibranceLabAndToneCurve(photo, output, config, identityCurve(), 100.0f, masks);
  for (std::size_t i = 0; i < photo.pixelCount(); ++i) {
    const RGBA8Pixel& in = photo.data.get()[i];
    const Lab lab = rgbToLab(in.r, in.g, in.b);
    const float base = 100.0f * masks.bilateralMask->data.get()[i];
    if (std::fabs(lab.L - base) < 1.0f) continue;
    RGBA8Pixel expected = in;
    labToRgb({lab.L > base ? 100.0f : 0.0f, lab.a, lab.b}, expected.r, expected.g, expected.b);
    vibranceInRGB(config.vibrance, expected.r, expected.g, expected.b);
    ASSERT_EQ(output.data.get()[i], expected);
  }
}

TEST(LabTonePass, DoesNotClampLightnessWithoutMasks) {
  // A curve to half as much again as white: a green pixel's a is far from 0, and the colour it
  // becomes depends on L beyond 100.
  const RGBA8Pixel green{20, 250, 30, 7};
  std::vector<float> curve = identityCurve();
  for (float& sample : curve) sample *= 1.5f;
  Image<RGBA8Pixel> output(1, 1);
  imageVibranceLabAndToneCurve(flatPicture(1, 1, green), output, withoutMasks(), curve, 100.0f,
                               ImageMasks<float, float>{});
  const Lab lab = rgbToLab(green.r, green.g, green.b);
  const auto atLightness = [&](float L) {
    RGBA8Pixel pixel = green;
    labToRgb({L, lab.a, lab.b}, pixel.r, pixel.g, pixel.b);
    vibranceInRGB(1.0f, pixel.r, pixel.g, pixel.b);
    return pixel;
  };
  EXPECT_EQ(output.row(0)[0], atLightness(1.5f * lab.L));
  EXPECT_NE(output.row(0)[0], atLightness(100.0f)) << "the test could not tell the difference";
}

TEST(LabTonePass, TreatsMasksThatWereNeverComputedAsOff) {
  const auto photo = photoLikePicture(20, 20, 5);
  Image<RGBA8Pixel> off(20, 20), empty(20, 20), allocated(20, 20);
  const ImageMasks<float, float> none;
  imageVibranceLabAndToneCurve(photo, off, withoutMasks(), identityCurve(), 100.0f, none);
  imageVibranceLabAndToneCurve(photo, empty, defaultFilterConfigValue, identityCurve(), 100.0f,
                               none);
  ImageMasks<float, float> unwritten;
  computeImageMasks(photo, {}, withoutMasks(), unwritten);
  imageVibranceLabAndToneCurve(photo, allocated, defaultFilterConfigValue, identityCurve(), 100.0f,
                               unwritten);
  EXPECT_EQ(fingerprint(empty), fingerprint(off));
  EXPECT_EQ(fingerprint(allocated), fingerprint(off));
}

TEST(LabTonePass, UsesMasksThatACallerFilled) {
  const auto photo = photoLikePicture(20, 20, 5);
  ImageMasks<float, float> computed;
  computeImageMasks(photo, {}, defaultFilterConfigValue, computed);
  const auto enhanced = [&photo](const ImageMasks<float, float>& masks) {
    Image<RGBA8Pixel> output(20, 20);
    imageVibranceLabAndToneCurve(photo, output, defaultFilterConfigValue, identityCurve(), 100.0f,
                                 masks);
    return fingerprint(output);
  };
  const std::string expected = enhanced(computed);
  EXPECT_NE(expected, enhanced({}));
  const ImageMasks<float, float> byHand{computed.bilateralMask, computed.ltmMask};
  EXPECT_EQ(enhanced(byHand), expected);

  ImageMasks<float, float> inPlaceOfUnwritten;
  computeImageMasks(photo, {}, withoutMasks(), inPlaceOfUnwritten);
  inPlaceOfUnwritten.bilateralMask = computed.bilateralMask;
  inPlaceOfUnwritten.ltmMask = computed.ltmMask;
  EXPECT_EQ(enhanced(inPlaceOfUnwritten), expected);

  ImageMasks<float, float> written;
  computeImageMasks(photo, {}, withoutMasks(), written);
  std::copy_n(computed.bilateralMask->data.get(), 400, written.bilateralMask->data.get());
  std::copy_n(computed.ltmMask->data.get(), 400, written.ltmMask->data.get());
  written.unwritten = nullptr;
  EXPECT_EQ(enhanced(written), expected);
}

TEST(LabTonePass, TreatsHalfARecordOfMasksAsOff) {
  const auto photo = photoLikePicture(20, 20, 5);
  ImageMasks<float, float> masks;
  computeImageMasks(photo, {}, defaultFilterConfigValue, masks);
  Image<RGBA8Pixel> off(20, 20), output(20, 20);
  imageVibranceLabAndToneCurve(photo, off, withoutMasks(), identityCurve(), 100.0f, masks);
  for (const auto& half : {ImageMasks<float, float>{masks.bilateralMask, nullptr},
                           ImageMasks<float, float>{nullptr, masks.ltmMask}}) {
    imageVibranceLabAndToneCurve(photo, output, defaultFilterConfigValue, identityCurve(), 100.0f,
                                 half);
    EXPECT_EQ(fingerprint(output), fingerprint(off));
  }
}

TEST(LabTonePass, StopsWhereTheShorterImageEnds) {
  const auto photo = photoLikePicture(10, 10, 6);
  Image<RGBA8Pixel> larger = flatPicture(10, 12, {1, 2, 3, 4});
  imageVibranceLabAndToneCurve(photo, larger, withoutMasks(), identityCurve(), 100.0f,
                               ImageMasks<float, float>{});
  EXPECT_EQ(larger.row(10)[0], (RGBA8Pixel{1, 2, 3, 4}));
  Image<RGBA8Pixel> smaller(10, 3);  // a sanitizer watches its end
  imageVibranceLabAndToneCurve(photo, smaller, withoutMasks(), identityCurve(), 100.0f,
                               ImageMasks<float, float>{});
  EXPECT_EQ(smaller.row(2)[9], larger.row(2)[9]);
}

TEST(LabTonePass, MayWorkInPlace) {
  const auto photo = noisePicture(30, 20, 7);
  Image<RGBA8Pixel> output(30, 20), inPlace(30, 20);
  std::copy_n(photo.data.get(), photo.pixelCount(), inPlace.data.get());
  ImageMasks<float, float> masks;
  computeImageMasks(photo, {}, defaultFilterConfigValue, masks);
  imageVibranceLabAndToneCurve(photo, output, defaultFilterConfigValue, identityCurve(), 100.0f,
                               masks);
  imageVibranceLabAndToneCurve(inPlace, inPlace, defaultFilterConfigValue, identityCurve(), 100.0f,
                               masks);
  EXPECT_EQ(fingerprint(inPlace), fingerprint(output));
}

TEST(LabTonePass, MovesTowardTheToneMappedBaseWhereTheMaskIsOne) {
  const auto photo = photoLikePicture(48, 48, 8);
  ImageMasks<float, float> masks;
  computeImageMasks(photo, {}, defaultFilterConfigValue, masks);
  masks.ltmMask->set(1.0f);
  FilterConfig config = defaultFilterConfigValue;
  config.ltmBlend = 1.0f;
  config.vibrance = 1.0f;
  Image<RGBA8Pixel> output(48, 48);
  const std::vector<float> curve = identityCurve();
  imageVibranceLabAndToneCurve(photo, output, config, curve, 100.0f, masks);
  for (std::size_t i = 0; i < photo.pixelCount(); ++i) {
    const RGBA8Pixel& in = photo.data.get()[i];
    const Lab lab = rgbToLab(in.r, in.g, in.b);
    RGBA8Pixel expected = in;
    std::vector<float> scaled = curve;
    for (float& sample : scaled) sample *= 100.0f;
    const float base =
        applyToneCurve(100.0f * masks.bilateralMask->data.get()[i], scaled, 50, 0.5f);
    labToRgb({std::min(base, 100.0f), lab.a, lab.b}, expected.r, expected.g, expected.b);
    vibranceInRGB(1.0f, expected.r, expected.g, expected.b);
    ASSERT_EQ(output.data.get()[i], expected);
  }
}

TEST(LabTonePass, GivesTheSameBytesForNaNEverywhere) {
  const auto photo = photoLikePicture(24, 16, 9);
  ImageMasks<float, float> masks;
  computeImageMasks(photo, {}, defaultFilterConfigValue, masks);
  FilterConfig config = defaultFilterConfigValue;
  config.ltmBlend = config.detailGain = std::nanf("");
  Image<RGBA8Pixel> output(24, 16);
  imageVibranceLabAndToneCurve(photo, output, config, std::vector<float>(51, std::nanf("")), 100.0f,
                               masks);
  // NaN reads the first sample of every table.
  RGBA8Pixel expected{0, 0, 0, 0};
  labToRgb({std::nanf(""), 0.0f, 0.0f}, expected.r, expected.g, expected.b);
  vibranceInRGB(1.0f, expected.r, expected.g, expected.b);
  for (std::size_t i = 0; i < output.pixelCount(); ++i) {
    expected.a = photo.data.get()[i].a;
    ASSERT_EQ(output.data.get()[i], expected);
  }
}

}  // namespace
}  // namespace pelorin::image_processing
