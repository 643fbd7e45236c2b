#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <limits>

#include "image_processing/autoenhance/colour/lab.h"
#include "image_processing/autoenhance/masks/face_blend.h"
#include "image_processing/autoenhance/masks/flatness_mask.h"
#include "image_processing/autoenhance/masks/image_masks.h"
#include "tests/support/fingerprint.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using Quantized = QuantizedFloat<unsigned char>;
using test_support::fingerprint;
using test_support::flatPicture;
using test_support::noisePicture;
using test_support::photoLikePicture;

using FloatMasks = ImageMasks<float, float>;
using ByteMasks = ImageMasks<Quantized, Quantized>;

constexpr RGBA8Pixel skin{224, 172, 140, 255};  // Lab a and b well inside both windows

ImageMetadata withFaces(std::initializer_list<BoundingBox> boxes) {
  ImageMetadata metadata;
  for (const BoundingBox& box : boxes) metadata.faces.push_back(std::make_shared<BoundingBox>(box));
  return metadata;
}

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
  EXPECT_FALSE(masks.computed);
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
  EXPECT_TRUE(masks.computed);
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

TEST(FlatnessMask, IsCentredOnePixelRightOfAndBelow) {
  // One pixel of detail at (20, 15): it lowers the mask where its window reaches, and no further.
  Image<float> lightness(40, 30), smoothed(40, 30), mask(40, 30);
  lightness.set(0.5f);
  smoothed.set(0.5f);
  lightness.row(15)[20] = 0.9f;
  const int r = 2;
  computeFlatnessMask(lightness, smoothed, r, mask);
  const auto lowered = [&](int x, int y) { return mask.row(y)[x] < 0.99f; };
  for (int y = 5; y < 25; ++y) {
    for (int x = 5; x < 35; ++x) {
      const bool inWindow =
          x + 1 - r <= 20 && 20 <= x + 1 + r && y + 1 - r <= 15 && 15 <= y + 1 + r;
      ASSERT_EQ(lowered(x, y), inWindow) << x << ", " << y;
    }
  }
}

TEST(FlatnessMask, StopsCountingAPixelAtTwentyOf255) {
  Image<float> lightness(20, 20), smoothed(20, 20), mask(20, 20);
  smoothed.set(0.5f);
  lightness.set(0.5f + 20.0f / 255.0f);
  computeFlatnessMask(lightness, smoothed, 3, mask);
  EXPECT_NEAR(mask.row(10)[10], 0.0f, 1e-5f);
}

TEST(FlatnessMask, TakesAnyRadius) {
  const Image<float> smoothed = [] {
    Image<float> image(9, 7);
    image.set(0.5f);
    return image;
  }();
  Image<float> lightness(9, 7), mask(9, 7);
  lightness.set(0.5f);
  for (const int radius : {0, 1, 5, 100}) {  // also far beyond the picture
    computeFlatnessMask(lightness, smoothed, radius, mask);
    EXPECT_NEAR(mask.row(3)[4], 1.0f, 1e-2f) << radius;
  }
  computeFlatnessMask(lightness, smoothed, -1, mask);
  EXPECT_EQ(mask.row(3)[4], 0.0f);
  if (sizeof(void*) == 8) {
    EXPECT_THROW(computeFlatnessMask(lightness, smoothed, 2147483647, mask), std::bad_alloc);
  }
}

TEST(FaceBlend, PullsSkinToOneHalfInTheMiddleOfTheFace) {
  const auto photo = flatPicture(40, 40, skin);
  Image<float> mask(40, 40);
  mask.set(1.0f);
  blendFaceIntoMask({15, 25, 25, 15}, photo, mask);
  EXPECT_NEAR(mask.row(20)[20], 0.5f, 0.01f);
  EXPECT_EQ(mask.row(9)[20], 1.0f);  // the region ends at 10
  EXPECT_NEAR(mask.row(10)[20], 1.0f, 1e-6f);
  EXPECT_GT(mask.row(12)[20], 0.6f);
}

TEST(FaceBlend, KeepsOnlyTheClampedPartAtTheBorder) {
  const auto photo = flatPicture(40, 40, skin);
  Image<float> mask(40, 40);
  mask.set(1.0f);
  blendFaceIntoMask({-10, 10, 12, 0}, photo, mask);
  // Columns 0 ... 20 (centre 0, length 20) and rows 0 ... 18 (centre 6, length 12).
  EXPECT_NEAR(mask.row(9)[10], 0.5f, 0.01f);
  EXPECT_EQ(mask.row(19)[10], 1.0f);
  EXPECT_EQ(mask.row(9)[21], 1.0f);
}

TEST(FaceBlend, AffectsTheClampedPartOfAFaceWhoseCentreIsOutside) {
  const auto photo = flatPicture(40, 40, skin);
  Image<float> mask(40, 40);
  mask.set(1.0f);
  blendFaceIntoMask({-30, -2, 30, 10}, photo, mask);  // centre -16, length 28: columns 0 ... 12
  EXPECT_LT(mask.row(20)[6], 0.6f);
  EXPECT_EQ(mask.row(20)[13], 1.0f);
}

TEST(FaceBlend, SkipsARegionWithoutWidthOrHeight) {
  const auto photo = flatPicture(40, 40, skin);
  for (const BoundingBox& box :
       {BoundingBox{10, 10, 20, 10}, BoundingBox{10, 20, 15, 15}, BoundingBox{100, 110, 20, 10},
        BoundingBox{10, 20, -50, -60}, BoundingBox{20, 10, 20, 10}, BoundingBox{10, 20, 10, 20},
        BoundingBox{2147483647, 2147483647, 2147483647, 2147483647}}) {
    Image<float> mask(40, 40);
    mask.set(0.25f);
    blendFaceIntoMask(box, photo, mask);
    for (std::size_t i = 0; i < mask.pixelCount(); ++i) ASSERT_EQ(mask.data.get()[i], 0.25f);
  }
}

TEST(FaceBlend, TakesTheLargestBox) {
  const auto photo = flatPicture(40, 40, skin);
  Image<float> mask(40, 40);
  mask.set(1.0f);
  constexpr std::int32_t least = std::numeric_limits<std::int32_t>::min(), most = 2147483647;
  blendFaceIntoMask({least, most, most, least}, photo, mask);
  EXPECT_NEAR(mask.row(20)[20], 0.5f, 0.01f);
}

TEST(FaceBlend, CompoundsOverlappingFaces) {
  const auto photo = flatPicture(40, 40, skin);
  Image<float> once(40, 40), twice(40, 40);
  once.set(1.0f);
  twice.set(1.0f);
  const BoundingBox face{15, 25, 25, 15};
  blendFaceIntoMask(face, photo, once);
  blendFaceIntoMask(face, photo, twice);
  blendFaceIntoMask(face, photo, twice);
  EXPECT_LT(twice.row(13)[20], once.row(13)[20]);
}

TEST(FaceBlend, RereadsTheByteWrittenBefore) {
  const auto photo = flatPicture(40, 40, skin);
  const BoundingBox face{15, 25, 25, 15};
  Image<Quantized> bytes(40, 40);
  Quantized start;
  start = 0.9f;
  bytes.set(start);
  blendFaceIntoMask(face, photo, bytes);
  Image<float> floats(40, 40);
  for (std::size_t i = 0; i < 1600; ++i) floats.data.get()[i] = bytes.data.get()[i];
  blendFaceIntoMask(face, photo, bytes);
  blendFaceIntoMask(face, photo, floats);
  for (std::size_t i = 0; i < 1600; ++i) {
    Quantized expected;
    expected = floats.data.get()[i];
    ASSERT_EQ(bytes.data.get()[i].stored(), expected.stored());
  }
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

TEST(ImageMasks, OfAnEmptyPhotoAreEmpty) {
  const FloatMasks masks = masksOf(Image<RGBA8Pixel>(0, 9), withFaces({{0, 5, 5, 0}}));
  EXPECT_TRUE(masks.computed);
  EXPECT_EQ(masks.ltmMask->pixelCount(), 0u);
}

}  // namespace
}  // namespace pelorin::image_processing
