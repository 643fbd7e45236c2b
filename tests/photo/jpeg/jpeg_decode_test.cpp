#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <climits>

#include "tests/support/jpeg_files.h"

namespace pelorin::photo {
namespace {

using test_support::Bytes;
using test_support::findSegment;
using test_support::jpegErrorOf;
using test_support::JpegRecipe;
using test_support::makeJpeg;
using test_support::progressiveScans;
using test_support::rgbaBytes;
using test_support::withFrameByte;
using test_support::withSize;

// One colour, which any coding gives back within rounding.
Bytes flatFile(JpegRecipe recipe, const Bytes& pixel) {
  Bytes pixels;
  for (std::uint32_t i = 0; i < recipe.width * recipe.height; ++i) {
    pixels.insert(pixels.end(), pixel.begin(), pixel.end());
  }
  recipe.quality = 100;
  return makeJpeg(recipe, pixels);
}

void expectEveryPixelNear(const DecodedPicture& picture, int r, int g, int b) {
  for (std::size_t i = 0; i < std::size_t{picture.width} * picture.height; ++i) {
    const std::uint8_t* p = picture.pixels.get() + i * 4;
    ASSERT_NEAR(p[0], r, 2);
    ASSERT_NEAR(p[1], g, 2);
    ASSERT_NEAR(p[2], b, 2);
    ASSERT_EQ(p[3], 255);
  }
}

TEST(DecodeJpeg, GivesRgbaWithFullAlpha) {
  expectEveryPixelNear(decodeJpeg(flatFile({.width = 19, .height = 11}, {200, 100, 50})), 200, 100,
                       50);
}

TEST(DecodeJpeg, GivesGreyAsEqualChannels) {
  const JpegRecipe grey = {
      .width = 9, .height = 7, .samples = JCS_GRAYSCALE, .stored = JCS_GRAYSCALE};
  expectEveryPixelNear(decodeJpeg(flatFile(grey, {77})), 77, 77, 77);
}

TEST(DecodeJpeg, ReadsFilesThatStoreRgb) {
  const JpegRecipe recipe = {.stored = JCS_RGB, .horizontalSampling = 1, .verticalSampling = 1};
  expectEveryPixelNear(decodeJpeg(flatFile(recipe, {10, 240, 90})), 10, 240, 90);
}

TEST(DecodeJpeg, ReadsEveryUsualSubsampling) {
  for (const auto& [horizontal, vertical] : {std::pair{1, 1}, {2, 1}, {1, 2}, {2, 2}, {4, 1}}) {
    const JpegRecipe recipe = {
        .width = 37, .height = 21, .horizontalSampling = horizontal, .verticalSampling = vertical};
    expectEveryPixelNear(decodeJpeg(flatFile(recipe, {60, 120, 180})), 60, 120, 180);
  }
}

TEST(DecodeJpeg, TakesTheScaleAsADivisorRoundedDownToAPowerOfTwo) {
  const Bytes file = flatFile({.width = 101, .height = 67}, {90, 150, 30});
  const std::vector<std::pair<int, std::uint32_t>> divisors = {
      {INT_MIN, 1}, {-2, 1}, {0, 1}, {1, 1}, {2, 2},  {3, 2},      {4, 4},
      {5, 4},       {7, 4},  {8, 8}, {9, 8}, {16, 8}, {INT_MAX, 8}};
  for (const auto& [scale, divisor] : divisors) {
    const DecodedPicture picture = decodeJpeg(file, scale);
    EXPECT_EQ(picture.width, (101 + divisor - 1) / divisor) << "scale " << scale;
    EXPECT_EQ(picture.height, (67 + divisor - 1) / divisor) << "scale " << scale;
    expectEveryPixelNear(picture, 90, 150, 30);
  }
}

TEST(DecodeJpegInto, AsksOnceForRoomOfTheDecodedSize) {
  const Bytes file = makeJpeg({.width = 101, .height = 67});
  for (const int scale : {1, 2, 8}) {
    const DecodedPicture expected = decodeJpeg(file, scale);
    Bytes pixels;
    int calls = 0;
    const auto makeRoom = [&](std::uint32_t width, std::uint32_t height) {
      ++calls;
      EXPECT_EQ(width, expected.width);
      EXPECT_EQ(height, expected.height);
      pixels.resize(std::size_t{width} * height * 4);
      return pixels.data();
    };
    decodeJpegInto(makeRoom, file, scale);
    EXPECT_EQ(calls, 1);
    EXPECT_EQ(pixels, rgbaBytes(expected));
  }
}

TEST(DecodeJpegInto, LetsPassWhatIsThrownForWantOfRoom) {
  const auto noRoom = [](std::uint32_t, std::uint32_t) -> std::uint8_t* { throw std::bad_alloc(); };
  EXPECT_THROW(decodeJpegInto(noRoom, makeJpeg({})), std::bad_alloc);
}

TEST(DecodeJpegInto, AsksForNoRoomBeyondTheLimits) {
  const auto never = [](std::uint32_t, std::uint32_t) -> std::uint8_t* {
    ADD_FAILURE() << "asked for room";
    throw std::bad_alloc();
  };
  const Bytes file = makeJpeg({.width = 32, .height = 24});
  EXPECT_THROW(decodeJpegInto(never, file, 1, {.pixels = 32 * 24 - 1}), PhotoError);
}

TEST(DecodeJpeg, ReadsThePhotoLikePictureItWasGiven) {
  const auto picture = test_support::photoLikePicture(160, 120, /*seed=*/5);
  const Bytes file = makeJpeg({.width = 160,
                               .height = 120,
                               .horizontalSampling = 1,
                               .verticalSampling = 1,
                               .quality = 100});
  EXPECT_LT(test_support::meanDifference(&picture.data.get()->r, decodeJpeg(file).pixels.get(),
                                         picture.pixelCount()),
            1.0);
}

TEST(DecodeJpeg, GivesTheSamePixelsForProgressiveAndSequentialFiles) {
  const Bytes expected = rgbaBytes(decodeJpeg(makeJpeg({.width = 65, .height = 43})));
  EXPECT_EQ(rgbaBytes(decodeJpeg(
                makeJpeg({.width = 65, .height = 43, .scans = test_support::channelScans()}))),
            expected);
  EXPECT_EQ(rgbaBytes(decodeJpeg(makeJpeg({.width = 65, .height = 43, .restartInterval = 2}))),
            expected);
  EXPECT_EQ(rgbaBytes(decodeJpeg(makeJpeg({.width = 65, .height = 43, .arithmetic = true}))),
            expected);
  EXPECT_EQ(rgbaBytes(decodeJpeg(makeJpeg(
                {.width = 65, .height = 43, .scans = test_support::completeProgressiveScans()}))),
            expected);
}

TEST(DecodeJpeg, StopsAtAHundredScans) {
  EXPECT_NO_THROW(decodeJpeg(makeJpeg({.scans = progressiveScans(100)})));
  const std::string tooMany = "too many scans: at most 100 can be read";
  for (const int scans : {101, 500}) {
    const Bytes file = makeJpeg({.scans = progressiveScans(scans)});
    EXPECT_EQ(jpegErrorOf([&] { decodeJpeg(file); }), tooMany);
    EXPECT_EQ(jpegErrorOf([&] { decodeJpeg(file, 8); }), tooMany);
    EXPECT_NO_THROW(decodeJpeg(file, 1, {.scans = scans}));
  }
}

TEST(DecodeJpeg, CountsRepeatedScansToo) {
  Bytes file = makeJpeg({.scans = progressiveScans(2)});
  const std::size_t last = findSegment(file, 0xDA, 1);
  const Bytes scan(file.begin() + static_cast<std::ptrdiff_t>(last), file.end() - 2);
  for (int i = 0; i < 498; ++i) file.insert(file.end() - 2, scan.begin(), scan.end());
  EXPECT_EQ(jpegErrorOf([&] { decodeJpeg(file); }), "too many scans: at most 100 can be read");
}

TEST(DecodeJpeg, ChecksTheClaimedSizeBeforeAnything) {
  const Bytes file = withSize(makeJpeg({}), 65500, 65500);
  EXPECT_EQ(jpegErrorOf([&] { decodeJpeg(file); }),
            "too large: 65500 x 65500 pixels, at most 268435456 can be read");
  EXPECT_NE(jpegErrorOf([&] { decodeJpeg(file, 8); }), "");
}

TEST(DecodeJpeg, TakesTheLimitAsTheLargestSizeThatPasses) {
  const Bytes file = makeJpeg({.width = 32, .height = 24});
  EXPECT_NO_THROW(decodeJpeg(file, 1, {.pixels = 32 * 24}));
  EXPECT_THROW(decodeJpeg(file, 1, {.pixels = 32 * 24 - 1}), PhotoError);
}

TEST(DecodeJpeg, ReadsThinPictures) {
  for (const auto& [width, height] : {std::pair{1u, 1u}, {65500u, 1u}, {1u, 65500u}}) {
    const DecodedPicture picture =
        decodeJpeg(flatFile({.width = width, .height = height}, {1, 128, 255}));
    EXPECT_EQ(picture.width, width);
    EXPECT_EQ(picture.height, height);
    expectEveryPixelNear(picture, 1, 128, 255);
  }
}

TEST(DecodeJpeg, RefusesUnsupportedKindsInOneClause) {
  for (const std::uint8_t bits : {12, 16}) {
    EXPECT_EQ(jpegErrorOf([&] { decodeJpeg(withFrameByte(makeJpeg({}), 2, bits)); }),
              "unsupported: only 8 bits a sample can be read");
  }
  Bytes lossless = makeJpeg({});
  lossless[findSegment(lossless, 0xC0) + 1] = 0xC3;
  EXPECT_EQ(jpegErrorOf([&] { decodeJpeg(lossless); }),
            "unsupported: neither a baseline nor a progressive JPEG file");
}

TEST(DecodeJpeg, RefusesTwoChannels) {
  // A grey file rewritten with a second channel in frame and scan.
  Bytes file = makeJpeg({.samples = JCS_GRAYSCALE,
                         .stored = JCS_GRAYSCALE,
                         .horizontalSampling = 1,
                         .verticalSampling = 1});
  const std::size_t frame = findSegment(file, 0xC0);
  file[frame + 3] += 3;
  file[frame + 9] = 2;
  const Bytes channel = {2, 0x11, 0};
  file.insert(file.begin() + static_cast<std::ptrdiff_t>(frame) + 13, channel.begin(),
              channel.end());
  const std::size_t scan = findSegment(file, 0xDA);
  file[scan + 3] += 2;
  file[scan + 4] = 2;
  const Bytes tables = {2, 0};
  file.insert(file.begin() + static_cast<std::ptrdiff_t>(scan) + 7, tables.begin(), tables.end());
  EXPECT_EQ(readJpegHeader(file).components, 2);
  EXPECT_EQ(jpegErrorOf([&] { decodeJpeg(file); }), "unsupported: neither grey, colour nor CMYK");
}

}  // namespace
}  // namespace pelorin::photo
