#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>

#include "tests/support/bytes.h"
#include "tests/support/jpeg_files.h"

namespace pelorin::photo {
namespace {

using test_support::Bytes;
using test_support::bytesOf;
using test_support::findSegment;
using test_support::jpegErrorOf;
using test_support::photoLikePicture;

constexpr std::uint32_t width = 75, height = 50;

Bytes encodedPhoto(int quality, std::span<const MetadataSegment> metadata = {}) {
  const auto picture = photoLikePicture(width, height, /*seed=*/9);
  return encodeJpeg(&picture.data.get()->r, width, height, quality, metadata);
}

double meanErrorOf(const Bytes& file) {
  const auto picture = photoLikePicture(width, height, /*seed=*/9);
  return test_support::meanDifference(&picture.data.get()->r, decodeJpeg(file).pixels.get(),
                                      picture.pixelCount());
}

TEST(EncodeJpeg, IsReadBackAsNearlyTheSamePicture) {
  const Bytes file = encodedPhoto(90);
  const JpegHeader header = readJpegHeader(file);
  EXPECT_EQ(header.width, width);
  EXPECT_EQ(header.height, height);
  EXPECT_EQ(header.components, 3);
  EXPECT_FALSE(header.coding.progressive);
  EXPECT_LT(meanErrorOf(file), 8.0);
}

TEST(EncodeJpeg, GetsCloserAndLargerWithQuality) {
  EXPECT_LT(encodedPhoto(20).size(), encodedPhoto(60).size());
  EXPECT_LT(encodedPhoto(60).size(), encodedPhoto(95).size());
  EXPECT_GT(meanErrorOf(encodedPhoto(20)), meanErrorOf(encodedPhoto(60)));
  EXPECT_GT(meanErrorOf(encodedPhoto(60)), meanErrorOf(encodedPhoto(95)));
}

TEST(EncodeJpeg, TakesAQualityOutsideItsRangeAsTheNearerEnd) {
  EXPECT_EQ(encodedPhoto(-5), encodedPhoto(1));
  EXPECT_EQ(encodedPhoto(0), encodedPhoto(1));
  EXPECT_EQ(encodedPhoto(1000), encodedPhoto(100));
}

TEST(EncodeJpeg, IgnoresAlpha) {
  auto picture = photoLikePicture(width, height, /*seed=*/9);
  const Bytes file = encodeJpeg(&picture.data.get()->r, width, height, 90);
  for (std::size_t i = 0; i < picture.pixelCount(); ++i) picture.data.get()[i].a = 3;
  EXPECT_EQ(encodeJpeg(&picture.data.get()->r, width, height, 90), file);
}

TEST(EncodeJpeg, GrowsTheFileWhereNoiseNeedsMoreThanAPhoto) {
  const auto noise = test_support::noisePicture(400, 400, /*seed=*/3);
  const Bytes file = encodeJpeg(&noise.data.get()->r, 400, 400, 100);
  EXPECT_GT(file.size(), 65536u + 400 * 400 / 4);
  EXPECT_EQ(Bytes(file.end() - 2, file.end()), (Bytes{0xFF, 0xD9}));
  EXPECT_EQ(decodeJpeg(file).height, 400u);
}

TEST(EncodeJpeg, WritesMetadataByteForByteAndInOrder) {
  const std::vector<MetadataSegment> metadata = {{0xE1, bytesOf({"Exif\0\0 and so on", 17})},
                                                 {0xE2, Bytes(65533, 0xFF)},
                                                 {0xED, {}},
                                                 {0xFE, bytesOf("a comment")}};
  const JpegHeader header = readJpegHeader(encodedPhoto(90, metadata));
  ASSERT_EQ(header.metadata.size(), metadata.size());
  for (std::size_t i = 0; i < metadata.size(); ++i) {
    EXPECT_EQ(header.metadata[i].marker, metadata[i].marker);
    EXPECT_EQ(header.metadata[i].payload, metadata[i].payload);
  }
}

TEST(EncodeJpeg, KeepsTheMetadataOfAFileWithJfifAndExif) {
  const Bytes source = test_support::makeJpeg(
      {.metadata = {{0xE1, bytesOf({"Exif\0\0", 6})}}, .profile = Bytes(100'000, 9)});
  const JpegHeader read = readJpegHeader(source);
  const JpegHeader written = readJpegHeader(encodedPhoto(90, read.metadata));
  ASSERT_EQ(written.metadata.size(), 4u);  // JFIF, Exif and two parts of the profile
  for (std::size_t i = 0; i < written.metadata.size(); ++i) {
    EXPECT_EQ(written.metadata[i].marker, read.metadata[i].marker);
    EXPECT_EQ(written.metadata[i].payload, read.metadata[i].payload);
  }
}

TEST(EncodeJpeg, AddsAJfifSegmentWhereNothingTellsTheFormat) {
  const std::vector<MetadataSegment> comment = {{0xFE, bytesOf("a comment")}};
  for (const Bytes& file : {encodedPhoto(90), encodedPhoto(90, comment)}) {
    EXPECT_EQ(findSegment(file, 0xE0), 2u);
  }
}

TEST(EncodeJpeg, RefusesWhatNoSegmentHolds) {
  const auto errorWith = [](MetadataSegment segment) {
    const std::vector<MetadataSegment> metadata = {std::move(segment)};
    return jpegErrorOf([&] { encodedPhoto(90, metadata); });
  };
  EXPECT_EQ(errorWith({0xE1, Bytes(65534)}), "a metadata segment is over 65533 bytes");
  for (const int marker : {0x00, 0xDA, 0xDF, 0xF0, 0xFD, 0xFF}) {
    EXPECT_EQ(errorWith({static_cast<std::uint8_t>(marker), {}}), "metadata must be APPn or COM");
  }
}

TEST(EncodeJpeg, RefusesSidesThatTheFormatCannotHold) {
  const std::uint8_t pixel[4] = {};
  const std::vector<std::pair<std::uint32_t, std::uint32_t>> sizes = {
      {0, 1}, {1, 0}, {65501, 1}, {1, 65501}, {4294967295u, 4294967295u}};
  for (const auto& [w, h] : sizes) {
    EXPECT_THAT(jpegErrorOf([&, w = w, h = h] { encodeJpeg(pixel, w, h, 90); }),
                testing::HasSubstr("only 1 to 65500 each way"));
  }
}

TEST(EncodeJpeg, WritesTheLongestThinPictures) {
  const Bytes pixels(65500 * 4, 128);
  EXPECT_EQ(decodeJpeg(encodeJpeg(pixels.data(), 65500, 1, 90)).width, 65500u);
  EXPECT_EQ(decodeJpeg(encodeJpeg(pixels.data(), 1, 65500, 90)).height, 65500u);
}

}  // namespace
}  // namespace pelorin::photo
