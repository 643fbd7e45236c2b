#include "cli/pictures/face_frames.h"

#include <gtest/gtest.h>

#include <limits>
#include <memory>

#include "tests/support/pictures.h"

namespace pelorin::cli {
namespace {

using image_processing::BoundingBox;
using image_processing::Image;
using image_processing::ImageMetadata;
using image_processing::RGBA8Pixel;

ImageMetadata faceAt(std::int32_t left, std::int32_t top, std::int32_t right, std::int32_t bottom) {
  BoundingBox box;
  box.left = left, box.top = top, box.right = right, box.bottom = bottom;
  ImageMetadata metadata;
  metadata.faces.push_back(std::make_shared<BoundingBox>(box));
  return metadata;
}

TEST(FaceFrames, StandWhereTheFaceIsInTheSmallPicture) {
  Image<RGBA8Pixel> small = test_support::flatPicture(40, 20, {100, 100, 100, 255});
  frameFaces(small, faceAt(80, 40, 240, 120), {400, 200});
  EXPECT_EQ(small.row(4)[8].r, 255);
  EXPECT_EQ(small.row(12)[24].r, 255);
  EXPECT_EQ(small.row(8)[8].r, 255);
  EXPECT_EQ(small.row(3)[7].r, 0);
  EXPECT_EQ(small.row(8)[25].r, 0);
  EXPECT_EQ(small.row(8)[16].r, 100) << "what is within stays";
  EXPECT_EQ(small.row(2)[6].r, 100);
}

TEST(FaceFrames, AreCutOffAtThePicturesEdges) {
  constexpr std::int32_t least = std::numeric_limits<std::int32_t>::min(),
                         most = std::numeric_limits<std::int32_t>::max();
  Image<RGBA8Pixel> small = test_support::flatPicture(8, 8, {100, 100, 100, 255});
  frameFaces(small, faceAt(least, least, most, most), {8, 8});
  EXPECT_EQ(small.row(0)[0].r, 100);
  frameFaces(small, faceAt(-5, 3, 5, 50), {8, 8});
  EXPECT_EQ(small.row(3)[0].r, 255);
  EXPECT_EQ(small.row(7)[5].r, 255);
}

}  // namespace
}  // namespace pelorin::cli
