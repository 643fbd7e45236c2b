// The whole preparation of a photo beside the definitions of its stages, byte for byte.
#include <gtest/gtest.h>

#include <cmath>
#include <vector>

#include "image_processing/autoenhance/colour/lab.h"
#include "image_processing/autoenhance/lightness/cdf.h"
#include "image_processing/autoenhance/masks/bilateral_filter.h"
#include "image_processing/autoenhance/masks/face_blend.h"
#include "image_processing/autoenhance/masks/flatness_mask.h"
#include "image_processing/autoenhance/masks/grid_blur.h"
#include "image_processing/autoenhance/masks/grid_slice.h"
#include "image_processing/autoenhance/masks/grid_splat.h"
#include "image_processing/autoenhance/masks/image_masks.h"
#include "tests/support/fingerprint.h"
#include "tests/support/instruction_sets.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using Quantized = QuantizedFloat<unsigned char>;
using test_support::fingerprint;
using test_support::onEveryInstructionSet;

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
  ImageMetadata metadata;
  metadata.faces.push_back(std::make_shared<BoundingBox>(BoundingBox{2, 14, 11, 3}));
  const Masks<T> expected = masksByDefinition<T>(photo, metadata, config);
  const std::vector<float> expectedCdf = cdfByDefinition(photo);
  onEveryInstructionSet(
      [&] {
        ImageStatistics statistics;
        ImageMasks<T, T> masks;
        prepareImage(photo, metadata, config, statistics, masks);
        ASSERT_TRUE(masks.computed);
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
class Preparation : public testing::Test {};
using MaskTypes = testing::Types<float, Quantized>;
TYPED_TEST_SUITE(Preparation, MaskTypes);

TYPED_TEST(Preparation, IsItsDefinitionAtAnySize) {
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
    SCOPED_TRACE(testing::Message() << width << " x " << height);
    for (const auto& photo : {test_support::photoLikePicture(width, height, 7),
                              test_support::noisePicture(width, height, 8)}) {
      expectTheDefinition<TypeParam>(photo, defaultFilterConfigValue);
    }
  }
}

TYPED_TEST(Preparation, IsItsDefinitionOnBlackGreyAndWhite) {
  for (const std::uint8_t code : {0, 1, 119, 255}) {
    expectTheDefinition<TypeParam>(test_support::flatPicture(130, 70, {code, code, code, 255}),
                                   defaultFilterConfigValue);
  }
}

TYPED_TEST(Preparation, IsItsDefinitionWithAnyConfiguration) {
  const auto photo = test_support::photoLikePicture(75, 58, 9);
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

TYPED_TEST(Preparation, CountsAlsoWhenNoMasksAreComputed) {
  const auto photo = test_support::photoLikePicture(75, 58, 10);
  FilterConfig config = defaultFilterConfigValue;
  config.detailGainHigh = 0.0f;
  ImageStatistics statistics;
  ImageMasks<TypeParam, TypeParam> masks;
  prepareImage(photo, {}, config, statistics, masks);
  EXPECT_FALSE(masks.computed);
  EXPECT_EQ(statistics.cdf, cdfByDefinition(photo));
}

TYPED_TEST(Preparation, OfAnEmptyPhotoIsEmpty) {
  for (const auto& [width, height] : {std::pair{0u, 9u}, {9u, 0u}, {0u, 0u}}) {
    const Image<RGBA8Pixel> photo(width, height);
    ImageStatistics statistics, alone;
    ImageMasks<TypeParam, TypeParam> masks;
    prepareImage(photo, {}, defaultFilterConfigValue, statistics, masks);
    analyzeImage(photo, {}, alone);
    EXPECT_TRUE(masks.computed);
    EXPECT_EQ(statistics.cdf, alone.cdf);
    EXPECT_EQ(statistics.faceMedianBin, -1);
  }
}

}  // namespace
}  // namespace pelorin::image_processing
