#include "cli/pictures/jpeg_band_encoder.h"

#include <gtest/gtest.h>

#include <cstdlib>

#include "photo/jpeg/jpeg_codec.h"
#include "tests/support/pictures.h"

namespace pelorin::cli {
namespace {

using image_processing::Image;
using image_processing::RGBA8Pixel;

TEST(JpegBandEncoder, MakesTheSameFileWhateverTheBands) {
  const auto picture = test_support::photoLikePicture(61, 47, 2);
  std::vector<std::uint8_t> whole;
  for (const std::uint32_t bandHeight : {47u, 16u, 1u}) {
    JpegBandEncoder encoder(61, 47, 90);
    for (std::uint32_t y = 0; y < 47; y += bandHeight) {
      const std::uint32_t height = std::min(bandHeight, 47 - y);
      encoder.add(Image<RGBA8Pixel>(61, height, {picture.data, picture.row(y)}));
    }
    const auto file = encoder.finish();
    if (whole.empty()) whole = file;
    EXPECT_EQ(file, whole);
  }
}

TEST(JpegBandEncoder, MakesAFileThatShowsThePicture) {
  const auto picture = test_support::photoLikePicture(64, 48, 5);
  JpegBandEncoder encoder(64, 48, 95);
  encoder.add(picture);
  const auto decoded = photo::decodeJpeg(encoder.finish());
  ASSERT_EQ(decoded.width, 64u);
  ASSERT_EQ(decoded.height, 48u);
  double difference = 0;
  for (std::size_t i = 0; i < picture.pixelCount(); ++i)
    difference += std::abs(decoded.pixels.get()[4 * i + 1] - picture.data.get()[i].g);
  EXPECT_LT(difference / static_cast<double>(picture.pixelCount()), 5);
}

TEST(JpegBandEncoder, TakesThinPictures) {
  for (const bool wide : {true, false}) {
    const std::uint32_t width = wide ? 65500 : 1, height = wide ? 1 : 65500;
    JpegBandEncoder encoder(width, height, 90);
    encoder.add(test_support::noisePicture(width, height, 1));
    const auto header = photo::readJpegHeader(encoder.finish());
    EXPECT_EQ(header.width, width);
    EXPECT_EQ(header.height, height);
  }
}

TEST(JpegBandEncoder, RefusesSizesAJpegFileCannotHave) {
  EXPECT_THROW(JpegBandEncoder(0, 1, 90), photo::PhotoError);
  EXPECT_THROW(JpegBandEncoder(1, 0, 90), photo::PhotoError);
  EXPECT_THROW(JpegBandEncoder(65501, 1, 90), photo::PhotoError);
  EXPECT_THROW(JpegBandEncoder(1, 4294967295u, 90), photo::PhotoError);
}

TEST(JpegBandEncoder, IsLetGoOfHalfWay) {
  JpegBandEncoder encoder(1000, 1000, 90);  // large enough for its memory to have moved
  encoder.add(test_support::noisePicture(1000, 500, 1));
}

TEST(JpegBandEncoder, RefusesToFinishEarly) {
  JpegBandEncoder encoder(100, 100, 90);
  encoder.add(test_support::noisePicture(100, 10, 1));
  EXPECT_THROW(encoder.finish(), photo::PhotoError);
}

}  // namespace
}  // namespace pelorin::cli
