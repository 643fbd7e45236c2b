#include "image_processing/autoenhance/lightness/face_lightness.h"

#include <gtest/gtest.h>

#include <cstdint>

#include "image_processing/autoenhance/colour/companding_steps.h"
#include "image_processing/autoenhance/lightness/cdf.h"
#include "tests/support/faces.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::photoLikePicture;
using test_support::Random;
using test_support::withFaces;

std::int32_t medianByRows(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata, int bins) {
  FaceLightness faces(metadata, photo.width, photo.height, bins, lightnessScale);
  for (std::uint32_t y = 0; y < photo.height; ++y) faces.addRow(y, photo.row(y));
  return faces.medianBin();
}

// Box by box and pixel by pixel.
std::int32_t medianByPixels(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata,
                            int bins) {
  LightnessHistogram histogram(bins, lightnessScale);
  for (const auto& face : metadata.faces) {
    for (std::uint32_t y = 0; y < photo.height; ++y) {
      for (std::uint32_t x = 0; x < photo.width; ++x) {
        if (face == nullptr || !face->contains(x, y)) continue;
        std::uint16_t step = 0;
        compandingSteps(photo.row(y) + x, &step, 1);
        histogram.add(&step, 1);
      }
    }
  }
  if (histogram.empty()) return -1;
  std::vector<float> cdf;
  computeCDF(histogram.normalised(), cdf);
  for (std::size_t i = 0; i + 1 < cdf.size(); ++i) {
    if (cdf[i] >= 0.5f) return static_cast<std::int32_t>(i);
  }
  return -1;
}

TEST(FaceLightness, CountsEveryPixelOnceForEachBoxItLiesIn) {
  Random random(5);
  const auto photo = photoLikePicture(45, 37, 2);
  for (int turn = 0; turn < 40; ++turn) {
    ImageMetadata metadata;
    for (int i = 0; i < turn % 9; ++i) {
      const auto left = static_cast<std::int32_t>(random.below(70)) - 15;
      const auto top = static_cast<std::int32_t>(random.below(60)) - 12;
      metadata.faces.push_back(std::make_shared<BoundingBox>(
          BoundingBox{left, left + static_cast<std::int32_t>(random.below(30)) - 3,
                      top + static_cast<std::int32_t>(random.below(30)) - 3, top}));
    }
    if (turn == 8) metadata.faces.push_back(nullptr);
    EXPECT_EQ(medianByRows(photo, metadata, 2000), medianByPixels(photo, metadata, 2000)) << turn;
  }
}

TEST(FaceLightness, CountsBoxesThatTouchOrReachOut) {
  constexpr std::int32_t least = INT32_MIN, most = INT32_MAX;
  const auto photo = photoLikePicture(20, 15, 8);
  for (const ImageMetadata& metadata :
       {withFaces({{0, 9, 14, 0}, {10, 19, 14, 0}}), withFaces({{0, 9, 7, 0}, {0, 9, 14, 8}}),
        withFaces({{least, most, most, least}, {19, 19, 14, 14}}),
        withFaces({{3, 3, 3, 3}, {3, 3, 3, 3}, {4, 4, 4, 4}})}) {
    EXPECT_EQ(medianByRows(photo, metadata, 2000), medianByPixels(photo, metadata, 2000));
  }
}

TEST(FaceLightness, CountsManyBoxesOfOneFace) {
  const auto photo = photoLikePicture(20, 15, 9);
  ImageMetadata metadata = withFaces({{2, 18, 9, 1}});
  metadata.faces.resize(50, metadata.faces.front());
  metadata.faces.push_back(std::make_shared<BoundingBox>(BoundingBox{0, 19, 14, 0}));
  EXPECT_EQ(medianByRows(photo, metadata, 2000), medianByPixels(photo, metadata, 2000));
}

}  // namespace
}  // namespace pelorin::image_processing
