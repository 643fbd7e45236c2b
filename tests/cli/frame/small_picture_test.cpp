#include "cli/frame/small_picture.h"

#include <gtest/gtest.h>

namespace pelorin::cli {
namespace {

using namespace image_processing;

Image<RGBA8Pixel> filled(RGBA8Pixel pixel) {
  Image<RGBA8Pixel> picture(16, 16);
  for (std::size_t i = 0; i < picture.pixelCount(); ++i) picture.data.get()[i] = pixel;
  return picture;
}

RGBA8Pixel shown(RGBA8Pixel pixel) {
  return photo::open(smallJpeg(filled(pixel), {}, 100)).image->data.get()[0];
}

TEST(SmallPicture, ShowsWhiteBehindWhatIsTransparent) {
  EXPECT_EQ(shown({0, 0, 0, 0}), (RGBA8Pixel{255, 255, 255, 255}));
  EXPECT_NEAR(shown({0, 0, 0, 128}).g, 127, 1);
}

TEST(SmallPicture, ShowsOpaqueColoursAsTheyAre) {
  EXPECT_EQ(shown({90, 90, 90, 255}), (RGBA8Pixel{90, 90, 90, 255}));
}

TEST(SmallPicture, IsDecodedNoSmallerThanItIsShown) {
  EXPECT_EQ(scaleForSide({4000, 3000}, 500), 8);
  EXPECT_EQ(scaleForSide({4000, 3000}, 501), 4);
  EXPECT_EQ(scaleForSide({400, 300}, 500), 1);
}

}  // namespace
}  // namespace pelorin::cli
