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
using test_support::makeJpeg;

TEST(JpegHeader, TellsSizeChannelsAndProgression) {
  const JpegHeader colour = readJpegHeader(makeJpeg({.width = 33, .height = 17}));
  EXPECT_EQ(colour.width, 33u);
  EXPECT_EQ(colour.height, 17u);
  EXPECT_EQ(colour.components, 3);
  EXPECT_FALSE(colour.coding.progressive);
  EXPECT_TRUE(
      readJpegHeader(makeJpeg({.scans = test_support::progressiveScans(10)})).coding.progressive);
  EXPECT_EQ(
      readJpegHeader(makeJpeg({.samples = JCS_GRAYSCALE, .stored = JCS_GRAYSCALE})).components, 1);
  EXPECT_EQ(readJpegHeader(makeJpeg({.samples = JCS_CMYK, .stored = JCS_YCCK})).components, 4);
}

TEST(JpegHeader, KeepsEverySegmentInFileOrderByteForByte) {
  std::vector<MetadataSegment> written;
  for (int n = 1; n < 16; ++n) {
    written.push_back(
        {static_cast<std::uint8_t>(0xE0 + n), bytesOf("segment " + std::to_string(n))});
  }
  written.push_back({0xFE, bytesOf("a comment with a \0 in it")});
  written.push_back({0xE1, Bytes(65533, 0xFF)});  // the longest there can be
  written.push_back({0xE1, {}});
  const JpegHeader header = readJpegHeader(makeJpeg({.metadata = written}));
  ASSERT_EQ(header.metadata.size(), written.size() + 1);  // libjpeg puts JFIF in front
  EXPECT_EQ(header.metadata[0].marker, 0xE0);
  EXPECT_EQ(Bytes(header.metadata[0].payload.begin(), header.metadata[0].payload.begin() + 4),
            bytesOf("JFIF"));
  for (std::size_t i = 0; i < written.size(); ++i) {
    EXPECT_EQ(header.metadata[i + 1].marker, written[i].marker);
    EXPECT_EQ(header.metadata[i + 1].payload, written[i].payload);
  }
}

TEST(JpegHeader, GivesAProfileOverSixtyFourKilobytesAsSeveralSegments) {
  const Bytes profile(150'000, 7);
  const JpegHeader header = readJpegHeader(makeJpeg({.profile = profile}));
  std::size_t total = 0;
  for (const MetadataSegment& segment : header.metadata) {
    if (segment.marker == 0xE2) total += segment.payload.size() - 14;  // name and two counters
  }
  EXPECT_EQ(header.metadata.size(), 4u);  // JFIF and three parts
  EXPECT_EQ(total, profile.size());
}

TEST(JpegHeader, LeavesAdobeSegmentsOutAndOtherApp14In) {
  const JpegHeader header = readJpegHeader(
      makeJpeg({.adobe = true, .metadata = {{0xEE, bytesOf("Adobf")}, {0xEE, bytesOf("Ad")}}}));
  const auto isApp14 = [](const MetadataSegment& segment) { return segment.marker == 0xEE; };
  EXPECT_EQ(std::count_if(header.metadata.begin(), header.metadata.end(), isApp14), 2);
}

TEST(JpegHeader, NeedsOnlyTheBytesBeforeThePictureData) {
  const Bytes file = makeJpeg({});
  const std::size_t scan = findSegment(file, 0xDA);
  const std::size_t end = scan + 2 + file[scan + 3];
  for (std::size_t size = 0; size < end; ++size) {
    EXPECT_THROW(readJpegHeader(std::span(file).first(size)), PhotoError) << size << " bytes";
  }
  EXPECT_EQ(readJpegHeader(std::span(file).first(end)).width, 32u);
}

TEST(JpegHeader, OfAHugeClaimIsReadWithoutAllocatingThePicture) {
  EXPECT_EQ(readJpegHeader(test_support::withSize(makeJpeg({}), 65500, 65500)).width, 65500u);
}

TEST(JpegHeader, SaysInOneClauseWhatIsWrong) {
  EXPECT_EQ(jpegErrorOf([] { readJpegHeader({}); }), "not a JPEG file");
  EXPECT_EQ(jpegErrorOf([] { readJpegHeader(bytesOf("GIF89a and so on")); }), "not a JPEG file");
  EXPECT_EQ(jpegErrorOf([] {
              readJpegHeader(Bytes{0xFF, 0xD8});
            }),
            "truncated: the picture data ends early");
  EXPECT_EQ(jpegErrorOf([] {
              readJpegHeader(Bytes{0xFF, 0xD8, 0xFF, 0xD9});
            }),
            "a JPEG file without a picture");
  EXPECT_EQ(jpegErrorOf([] { readJpegHeader(test_support::withSize(makeJpeg({}), 65501, 1)); }),
            "a side is over 65500 pixels");
  EXPECT_THAT(jpegErrorOf([] { readJpegHeader(test_support::withSize(makeJpeg({}), 32, 0)); }),
              testing::StartsWith("damaged: "));
}

}  // namespace
}  // namespace pelorin::photo
