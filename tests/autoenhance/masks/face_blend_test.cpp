#include "image_processing/autoenhance/masks/face_blend.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <limits>

#include "tests/support/mask_types.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::Quantized;

using test_support::flatPicture;

constexpr RGBA8Pixel skin{224, 172, 140, 255};  // Lab a and b well inside both windows

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

TEST(FaceBlend, TruncatesTheCentreTowardZero) {
  const auto photo = flatPicture(40, 40, skin);
  Image<float> mask(40, 40);
  mask.set(1.0f);
  blendFaceIntoMask({10, 15, 30, 10}, photo, mask);  // 12 and not 12.5: columns 7 ... 17
  EXPECT_LT(mask.row(20)[8], 0.9f);
  EXPECT_LT(mask.row(20)[16], 0.9f);
  EXPECT_EQ(mask.row(20)[18], 1.0f);

  mask.set(1.0f);
  blendFaceIntoMask({-8, 7, 30, 10}, photo, mask);  // 0 and not -1: columns 0 ... 15
  EXPECT_LT(mask.row(20)[14], 0.95f);
  mask.set(1.0f);
  blendFaceIntoMask({10, 30, 7, -8}, photo, mask);  // rows likewise
  EXPECT_LT(mask.row(14)[20], 0.95f);
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

}  // namespace
}  // namespace pelorin::image_processing
