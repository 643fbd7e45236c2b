#include <gtest/gtest.h>

#include <ctime>

#include "image_processing/autoenhance/masks/image_masks.h"
#include "tests/support/mask_types.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::photoLikePicture;
using test_support::Quantized;

double preparing(const Image<RGBA8Pixel>& photo, std::size_t faces) {
  ImageMetadata metadata;
  for (std::size_t i = 0; i < faces; ++i) {
    const auto right = static_cast<std::int32_t>(photo.width) - 1;
    const auto bottom = static_cast<std::int32_t>(photo.height) - 1;
    metadata.faces.push_back(std::make_shared<BoundingBox>(BoundingBox{0, right, bottom, 0}));
  }
  ImageStatistics statistics;
  ImageMasks<Quantized, Quantized> masks;
  const std::clock_t start = std::clock();
  prepareImage(photo, metadata, FilterConfig(), statistics, masks);
  return static_cast<double>(std::clock() - start);
}

// A file may name as many faces as it likes.
TEST(ManyFaces, CostLittleMoreThanOne) {
  const auto photo = photoLikePicture(300, 200, 4);
  preparing(photo, 1);
  const double one = preparing(photo, 1);
  EXPECT_LT(preparing(photo, 1000), 40 * one);  // face by face it is about 400 times
}

}  // namespace
}  // namespace pelorin::image_processing
