#include "image_processing/autoenhance/masks/face_region.h"

#include <gtest/gtest.h>

namespace pelorin::image_processing {
namespace {

BoundingBox box(int left, int top, int right, int bottom) {
  BoundingBox face;
  face.left = left;
  face.top = top;
  face.right = right;
  face.bottom = bottom;
  return face;
}

void expectSide(const FaceSide& side, std::int64_t first, std::int64_t last) {
  EXPECT_EQ(side.first, first);
  EXPECT_EQ(side.last, last);
}

TEST(FaceRegion, IsTwiceTheBoxAboutItsCentreCutToThePhoto) {
  const auto inside = faceRegion(box(40, 50, 60, 80), 200, 200);
  ASSERT_TRUE(inside);
  expectSide(inside->columns, 30, 70);
  expectSide(inside->rows, 35, 95);
  const auto cut = faceRegion(box(0, 90, 20, 110), 100, 100);
  ASSERT_TRUE(cut);
  expectSide(cut->columns, 0, 30);
  expectSide(cut->rows, 80, 99);
}

TEST(FaceRegion, OfNothingIsNone) {
  EXPECT_FALSE(faceRegion(box(40, 50, 60, 80), 0, 200));
  EXPECT_FALSE(faceRegion(box(40, 50, 60, 80), 200, 0));
  EXPECT_FALSE(faceRegion(box(40, 50, 40, 80), 200, 200));    // no width
  EXPECT_FALSE(faceRegion(box(40, 80, 60, 50), 200, 200));    // reversed
  EXPECT_FALSE(faceRegion(box(300, 50, 320, 80), 200, 200));  // outside
}

TEST(FaceSide, WeighsTheMiddleMostAndTheEndsNotAtAll) {
  const std::vector<float> weights = FaceSide{10, 30}.weights();
  ASSERT_EQ(weights.size(), 21u);
  EXPECT_EQ(weights.front(), 0.0f);
  EXPECT_NEAR(weights[10], 1.0f, 1e-3f);
  EXPECT_NEAR(weights.back(), 0.0f, 0.01f);
  for (std::size_t i = 0; i < 10; ++i) EXPECT_LE(weights[i], weights[i + 1]) << i;
}

}  // namespace
}  // namespace pelorin::image_processing
