#include "image_processing/autoenhance/masks/image_masks.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <string>
#include <utility>
#include <vector>

#include "image_processing/autoenhance/colour/lab.h"
#include "image_processing/autoenhance/lightness/cdf.h"
#include "image_processing/autoenhance/masks/bilateral_filter.h"
#include "image_processing/autoenhance/masks/face_blend.h"
#include "image_processing/autoenhance/masks/flatness_mask.h"
#include "image_processing/autoenhance/masks/grid_blur.h"
#include "image_processing/autoenhance/masks/grid_slice.h"
#include "image_processing/autoenhance/masks/grid_splat.h"
#include "tests/support/faces.h"
#include "tests/support/fingerprint.h"
#include "tests/support/instruction_sets.h"
#include "tests/support/mask_types.h"
#include "tests/support/new_memory.h"
#include "tests/support/pictures.h"
#include "tests/support/slow_build.h"

namespace pelorin::image_processing {
namespace {

using test_support::fingerprint;
using test_support::flatPicture;
using test_support::noisePicture;
using test_support::onEveryInstructionSet;
using test_support::photoLikePicture;
using test_support::Quantized;
using test_support::withFaces;

using FloatMasks = ImageMasks<float, float>;
using ByteMasks = ImageMasks<Quantized, Quantized>;

constexpr RGBA8Pixel skin{224, 172, 140, 255};  // Lab a and b well inside both windows

template <typename Masks = FloatMasks>
Masks masksOf(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata = {},
              const FilterConfig& config = defaultFilterConfigValue) {
  Masks masks;
  computeImageMasks(photo, metadata, config, masks);
  return masks;
}

TEST(ImageMasks, AreAllocatedAndNotComputedWithoutDetailGain) {
  FilterConfig config = defaultFilterConfigValue;
  config.detailGainHigh = 0.0f;
  const FloatMasks masks = masksOf(photoLikePicture(30, 20, 1), {}, config);
  EXPECT_FALSE(masks.present());
  ASSERT_NE(masks.bilateralMask, nullptr);
  ASSERT_NE(masks.ltmMask, nullptr);
  EXPECT_EQ(masks.bilateralMask->width, 30u);
  EXPECT_EQ(masks.ltmMask->height, 20u);
}

TEST(ImageMasks, ReplaceWhatTheRecordHeld) {
  FloatMasks masks = masksOf(photoLikePicture(30, 20, 1));
  const auto before = masks.ltmMask;
  computeImageMasks(photoLikePicture(11, 9, 2), {}, defaultFilterConfigValue, masks);
  EXPECT_NE(masks.ltmMask, before);
  EXPECT_EQ(masks.ltmMask->width, 11u);
  EXPECT_EQ(before.use_count(), 1);
}

TEST(ImageMasks, HaveThePhotosSizeAndUsualRange) {
  const FloatMasks masks = masksOf(photoLikePicture(97, 61, 3));
  EXPECT_TRUE(masks.present());
  for (const auto& mask : {masks.bilateralMask, masks.ltmMask}) {
    ASSERT_EQ(mask->pixelCount(), 97u * 61u);
    for (std::size_t i = 0; i < mask->pixelCount(); ++i) {
      ASSERT_GE(mask->data.get()[i], 0.0f);
      ASSERT_LE(mask->data.get()[i], 1.0001f);
    }
  }
}

TEST(ImageMasks, ComeFromTheExactFilterWhenTheGridIsOff) {
  FilterConfig config = defaultFilterConfigValue;
  config.useBilateralGrid = 0;
  config.bilateralSpatialFraction = 0.1f;
  const auto photo = photoLikePicture(60, 40, 4);
  FilterConfig grid = config;
  grid.useBilateralGrid = 1;
  EXPECT_NE(fingerprint(*masksOf(photo, {}, config).bilateralMask),
            fingerprint(*masksOf(photo, {}, grid).bilateralMask));
}

TEST(ImageMasks, TakeASpatialExtentOfAtLeastOnePixel) {
  const auto photo = photoLikePicture(50, 30, 5);
  FilterConfig one = defaultFilterConfigValue;
  one.bilateralSpatialFraction = 1.0f / 30.0f;
  const std::string expected = fingerprint(*masksOf(photo, {}, one).bilateralMask);
  for (const float fraction : {0.0f, -5.0f, 0.01f, std::nanf("")}) {
    FilterConfig config = defaultFilterConfigValue;
    config.bilateralSpatialFraction = fraction;
    EXPECT_EQ(fingerprint(*masksOf(photo, {}, config).bilateralMask), expected) << fraction;
  }
}

TEST(ImageMasks, OfAnEmptyPhotoAreEmpty) {
  const FloatMasks masks = masksOf(Image<RGBA8Pixel>(0, 9), withFaces({{0, 5, 5, 0}}));
  EXPECT_TRUE(masks.present());
  EXPECT_EQ(masks.ltmMask->pixelCount(), 0u);
}

TEST(LtmMask, IsZeroWithoutAmountExceptOnSkinNearFaces) {
  Image<RGBA8Pixel> photo = flatPicture(60, 60, {40, 90, 200, 255});
  for (std::uint32_t y = 20; y < 40; ++y) {
    for (std::uint32_t x = 20; x < 40; ++x) photo.row(y)[x] = skin;
  }
  for (const float amount : {0.0f, -1.0f, std::nanf("")}) {
    FilterConfig config = defaultFilterConfigValue;
    config.ltmMaskAmount = amount;
    const Image<float> plain = *masksOf(photo, {}, config).ltmMask;
    for (std::size_t i = 0; i < plain.pixelCount(); ++i) ASSERT_EQ(plain.data.get()[i], 0.0f);
    const Image<float> faced = *masksOf(photo, withFaces({{22, 38, 38, 22}}), config).ltmMask;
    EXPECT_NEAR(faced.row(30)[30], 0.5f, 0.01f);
    EXPECT_EQ(faced.row(45)[30], 0.0f);  // in the region, but blue
    EXPECT_EQ(faced.row(5)[5], 0.0f);
  }
}

TEST(LtmMask, IsOneOnAFlatPhoto) {
  const Image<float> mask = *masksOf(flatPicture(80, 50, {120, 120, 120, 255})).ltmMask;
  // The smoothing returns a constant only to a few parts in a million, and the sums round.
  for (std::size_t i = 0; i < mask.pixelCount(); ++i) ASSERT_NEAR(mask.data.get()[i], 1.0f, 5e-3f);
}

TEST(LtmMask, IsNearZeroInNoise) {
  const Image<float> mask = *masksOf(noisePicture(80, 50, 1)).ltmMask;
  for (std::size_t i = 0; i < mask.pixelCount(); ++i) ASSERT_LT(mask.data.get()[i], 0.35f);
}

TEST(LtmMask, TakesItsDetailFromTheByteInTheEightBitVariant) {
  const auto photo = photoLikePicture(64, 48, 9);
  const ByteMasks masks = masksOf<ByteMasks>(photo);
  Image<float> lightness(64, 48), base(64, 48), mask(64, 48);
  for (std::size_t i = 0; i < photo.pixelCount(); ++i) {
    const RGBA8Pixel& p = photo.data.get()[i];
    lightness.data.get()[i] = rgbToLab(p.r, p.g, p.b).L / 100.0f;
    base.data.get()[i] = masks.bilateralMask->data.get()[i].stored() / 255.0f;
  }
  computeFlatnessMask(lightness, base, 8, mask);
  for (std::size_t i = 0; i < photo.pixelCount(); ++i) {
    Quantized expected;
    expected = mask.data.get()[i];
    ASSERT_EQ(masks.ltmMask->data.get()[i].stored(), expected.stored());
  }
}

std::vector<float> cdfByDefinition(const Image<RGBA8Pixel>& photo) {
  std::vector<float> counts(50), cdf;
  for (std::size_t i = 0; i < photo.pixelCount(); ++i) {
    const RGBA8Pixel& p = photo.data.get()[i];
    const float L = rgbToLab(p.r, p.g, p.b).L;
    counts[static_cast<std::size_t>(49.0f * L / 100.0f)] += 1.0f;
  }
  const float share = 1.0f / static_cast<float>(photo.pixelCount());
  for (float& count : counts) count *= share;
  computeCDF(counts, cdf);
  return cdf;
}

template <typename T>
struct Masks {
  Image<T> bilateral, ltm;
};

template <typename T>
Masks<T> masksByDefinition(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata,
                           const FilterConfig& config) {
  Image<float> lightness(photo.width, photo.height);
  for (std::size_t i = 0; i < photo.pixelCount(); ++i) {
    const RGBA8Pixel& p = photo.data.get()[i];
    lightness.data.get()[i] = rgbToLab(p.r, p.g, p.b).L / 100.0f;
  }
  Masks<T> masks{{photo.width, photo.height}, {photo.width, photo.height}};
  const float side = static_cast<float>(std::min(photo.width, photo.height));
  const auto cell =
      static_cast<std::uint32_t>(std::max(side * config.bilateralSpatialFraction, 1.0f));
  if (config.useBilateralGrid != 0) {
    Grid grid(std::max(photo.width / cell, 1u), std::max(photo.height / cell, 1u));
    splatScalar(lightness, static_cast<float>(cell), grid);
    blurScalar(grid, config.bilateralRange);
    sliceScalar(grid, lightness, static_cast<float>(cell), masks.bilateral);
  } else {
    bilateralFilter(lightness, config.bilateralRange, static_cast<int>(cell), masks.bilateral);
  }
  if (config.ltmMaskAmount > 0.0f) {
    computeFlatnessMaskScalar(lightness, masks.bilateral, config.ltmMaskRadius, masks.ltm);
  } else {
    T zero;
    zero = 0.0f;
    masks.ltm.set(zero);
  }
  for (const auto& face : metadata.faces) blendFaceIntoMask(*face, photo, masks.ltm);
  return masks;
}

template <typename T>
void expectTheDefinition(const Image<RGBA8Pixel>& photo, const FilterConfig& config) {
  const ImageMetadata metadata = withFaces({{2, 14, 11, 3}});
  const Masks<T> expected = masksByDefinition<T>(photo, metadata, config);
  const std::vector<float> expectedCdf = cdfByDefinition(photo);
  onEveryInstructionSet(
      [&] {
        ImageStatistics statistics;
        ImageMasks<T, T> masks;
        prepareImage(photo, metadata, config, statistics, masks);
        ASSERT_TRUE(masks.present());
        ASSERT_EQ(fingerprint(*masks.bilateralMask), fingerprint(expected.bilateral));
        ASSERT_EQ(fingerprint(*masks.ltmMask), fingerprint(expected.ltm));
        ASSERT_EQ(statistics.cdf, expectedCdf);

        ImageStatistics alone;
        analyzeImage(photo, metadata, alone);
        ASSERT_EQ(alone.cdf, expectedCdf);
        ASSERT_EQ(alone.faceMedianBin, statistics.faceMedianBin);

        ImageMasks<T, T> onlyMasks;
        computeImageMasks(photo, metadata, config, onlyMasks);
        ASSERT_EQ(fingerprint(*onlyMasks.bilateralMask), fingerprint(expected.bilateral));
        ASSERT_EQ(fingerprint(*onlyMasks.ltmMask), fingerprint(expected.ltm));
      },
      HWY_AVX3_DL);
}

template <typename T>
class PrepareImage : public testing::Test {};
TYPED_TEST_SUITE(PrepareImage, test_support::MaskTypes);

TYPED_TEST(PrepareImage, IsItsDefinitionAtAnySize) {
  for (const auto& [width, height] : {std::pair{1u, 1u},
                                      {1u, 37u},
                                      {53u, 1u},
                                      {2u, 2u},
                                      {3u, 90u},
                                      {31u, 33u},
                                      {97u, 61u},
                                      {160u, 129u},
                                      {515u, 40u},
                                      {1100u, 45u},
                                      {321u, 241u}}) {
    if (test_support::slowBuild && width == 321) continue;
    SCOPED_TRACE(testing::Message() << width << " x " << height);
    for (const auto& photo : {photoLikePicture(width, height, 7), noisePicture(width, height, 8)}) {
      expectTheDefinition<TypeParam>(photo, defaultFilterConfigValue);
    }
  }
}

TYPED_TEST(PrepareImage, IsItsDefinitionOnBlackGreyAndWhite) {
  for (const std::uint8_t code : {0, 1, 119, 255}) {
    expectTheDefinition<TypeParam>(flatPicture(130, 70, {code, code, code, 255}),
                                   defaultFilterConfigValue);
  }
}

TYPED_TEST(PrepareImage, IsItsDefinitionWithAnyConfiguration) {
  const auto photo = photoLikePicture(75, 58, 9);
  const auto with = [&](auto change) {
    FilterConfig config = defaultFilterConfigValue;
    change(config);
    expectTheDefinition<TypeParam>(photo, config);
  };
  for (const int radius : {-2147483647 - 1, -1, 0, 1, 29, 57, 58, 300}) {
    with([&](FilterConfig& config) { config.ltmMaskRadius = radius; });
  }
  for (const float range : {-1.0f, 0.0f, 0.03f, 0.1f, 1.0f, 1e30f}) {
    with([&](FilterConfig& config) { config.bilateralRange = range; });
  }
  for (const float fraction : {0.0f, 0.1f, 0.4f, 1.0f, 1.9f, 1e6f}) {
    with([&](FilterConfig& config) { config.bilateralSpatialFraction = fraction; });
  }
  for (const float amount : {-1.0f, 0.0f, 0.01f}) {
    with([&](FilterConfig& config) { config.ltmMaskAmount = amount; });
  }
  with([&](FilterConfig& config) {
    config.useBilateralGrid = 0;
    config.bilateralSpatialFraction = 0.05f;
  });
}

TYPED_TEST(PrepareImage, CountsAlsoWhenNoMasksAreComputed) {
  const auto photo = photoLikePicture(75, 58, 10);
  FilterConfig config = defaultFilterConfigValue;
  config.detailGainHigh = 0.0f;
  ImageStatistics statistics;
  ImageMasks<TypeParam, TypeParam> masks;
  prepareImage(photo, {}, config, statistics, masks);
  EXPECT_FALSE(masks.present());
  EXPECT_EQ(statistics.cdf, cdfByDefinition(photo));
}

TYPED_TEST(PrepareImage, OfAnEmptyPhotoIsEmpty) {
  for (const auto& [width, height] : {std::pair{0u, 9u}, {9u, 0u}, {0u, 0u}}) {
    const Image<RGBA8Pixel> photo(width, height);
    ImageStatistics statistics, alone;
    ImageMasks<TypeParam, TypeParam> masks;
    prepareImage(photo, {}, defaultFilterConfigValue, statistics, masks);
    analyzeImage(photo, {}, alone);
    EXPECT_TRUE(masks.present());
    EXPECT_EQ(statistics.cdf, alone.cdf);
    EXPECT_EQ(statistics.faceMedianBin, -1);
  }
}

template <typename T>
class ImageMasksOf : public testing::Test {};
TYPED_TEST_SUITE(ImageMasksOf, test_support::MaskTypes);

TYPED_TEST(ImageMasksOf, AreTwoImagesThatNobodyWritesWithoutDetailGain) {
  const auto photo = flatPicture(400, 300, skin);
  FilterConfig config = defaultFilterConfigValue;
  config.detailGainHigh = 0.0f;
  for (const std::int32_t grid : {0, 1}) {
    config.useBilateralGrid = grid;
    // Whatever has a value for each pixel: two masks, and no lightness.
    const test_support::NewMemory images(photo.pixelCount());
    ImageMasks<TypeParam, TypeParam> masks;
    computeImageMasks(photo, withFaces({{100, 300, 250, 50}}), config, masks);
    EXPECT_EQ(images.blocks(), 2);
    EXPECT_TRUE(images.untouched());
  }
}

TYPED_TEST(ImageMasksOf, ComeFromTheGridForAnyNumberButZero) {
  const auto photo = photoLikePicture(60, 40, 11);
  FilterConfig config = defaultFilterConfigValue;
  config.bilateralSpatialFraction = 0.1f;
  const auto bilateral = [&](std::int32_t useBilateralGrid) {
    config.useBilateralGrid = useBilateralGrid;
    return fingerprint(*masksOf<ImageMasks<TypeParam, TypeParam>>(photo, {}, config).bilateralMask);
  };
  for (const std::int32_t any : {-1, 2, 256, -2147483647 - 1}) {
    EXPECT_EQ(bilateral(any), bilateral(1)) << any;
  }
  EXPECT_NE(bilateral(0), bilateral(1));
}

}  // namespace
}  // namespace pelorin::image_processing
