#include "image_processing/dupe/grayscale.h"

#include <gtest/gtest.h>

#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

TEST(Grayscale, IsTheGreenChannelInStorageOrder) {
  const Image<RGBA8Pixel> image = test_support::noisePicture(67, 31, 5);
  const Image<unsigned char> grey = imageMakeGrayscale(image);
  EXPECT_EQ(grey.width, 67u);
  EXPECT_EQ(grey.height, 31u);
  EXPECT_EQ(grey.bytesPerPixel, 1u);
  for (std::size_t i = 0; i < image.pixelCount(); ++i) {
    ASSERT_EQ(grey.data.get()[i], image.data.get()[i].g) << i;
  }
}

TEST(Grayscale, OwnsItsPixels) {
  const Image<RGBA8Pixel> image = test_support::flatPicture(2, 2, {1, 2, 3, 4});
  const Image<unsigned char> grey = imageMakeGrayscale(image);
  image.row(0)[0].g = 99;
  EXPECT_EQ(grey.row(0)[0], 2);
}

TEST(Grayscale, OfAnEmptyImageIsEmpty) {
  const Image<unsigned char> grey = imageMakeGrayscale(Image<RGBA8Pixel>(0, 9));
  EXPECT_EQ(grey.width, 0u);
  EXPECT_EQ(grey.height, 9u);
  EXPECT_EQ(grey.byteSize(), 0u);
}

}  // namespace
}  // namespace pelorin::image_processing
