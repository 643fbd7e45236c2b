#include "photo/png/png_file.h"

#include <gtest/gtest.h>

#include <cstring>

#include "tests/support/pictures.h"

namespace pelorin::photo {
namespace {

using image_processing::Image;
using image_processing::RGBA8Pixel;
using test_support::noisePicture;

TEST(PngFile, GivesBackEveryByteOfAPictureWithAlpha) {
  for (const auto& picture : {noisePicture(1, 1, 1), noisePicture(33, 17, 2),
                              noisePicture(65500, 1, 3), noisePicture(1, 65500, 4)}) {
    const auto back = decodePng(encodePng(picture));
    ASSERT_EQ(back.width, picture.width);
    ASSERT_EQ(back.height, picture.height);
    EXPECT_EQ(std::memcmp(back.data.get(), picture.data.get(), picture.byteSize()), 0);
  }
}

TEST(PngFile, GivesBackEveryGrey) {
  Image<unsigned char> grey(256, 1);
  for (int i = 0; i < 256; ++i) grey.data.get()[i] = static_cast<unsigned char>(i);
  const auto back = decodePng(encodePng(grey));
  ASSERT_EQ(back.width, 256u);
  for (int i = 0; i < 256; ++i) {
    const auto value = static_cast<std::uint8_t>(i);
    ASSERT_EQ(back.data.get()[i], (RGBA8Pixel{value, value, value, 255}));
  }
}

TEST(PngFile, RefusesPicturesWithoutPixels) {
  EXPECT_THROW(encodePng(Image<RGBA8Pixel>(0, 0)), PhotoError);
  EXPECT_THROW(encodePng(Image<RGBA8Pixel>(0, 5)), PhotoError);
  EXPECT_THROW(encodePng(Image<unsigned char>(5, 0)), PhotoError);
}

TEST(PngFile, RefusesSizesBeyondWhatTheLibraryCounts) {
  // Nothing is read from the pixels of a picture that is refused.
  const auto pixel = std::make_shared<RGBA8Pixel>();
  EXPECT_THROW(encodePng(Image<RGBA8Pixel>(65500, 65500, pixel)), PhotoError);
  EXPECT_THROW(encodePng(Image<RGBA8Pixel>(4294967295u, 1, pixel)), PhotoError);
}

TEST(PngFile, RefusesBytesThatAreNoPng) {
  EXPECT_THROW(decodePng({}), PhotoError);
  const std::vector<std::uint8_t> text(100, 'x');
  EXPECT_THROW(decodePng(text), PhotoError);
}

TEST(PngFile, RefusesAFileCutBeforeItsPixelsEnd) {
  const auto file = encodePng(noisePicture(9, 9, 5));
  const std::size_t endMarker = 12, checksums = 8;  // behind the last pixel
  for (std::size_t length = 0; length < file.size() - endMarker - checksums; ++length) {
    EXPECT_THROW(decodePng(std::span(file).first(length)), PhotoError) << length;
  }
}

}  // namespace
}  // namespace pelorin::photo
