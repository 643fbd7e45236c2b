#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <climits>
#include <map>
#include <utility>

#include "tests/platform/pn_imgproc/jpeg_files.h"

namespace pelorin::imgproc {
namespace {

using test_support::Bytes;
using test_support::jpegErrorOf;
using test_support::JpegRecipe;
using test_support::makeJpeg;
using test_support::rgbaBytes;

using Size = std::pair<std::uint32_t, std::uint32_t>;

Size sizeOf(const Bytes& file) {
  const JpegHeader header = readJpegHeader(file);
  return {header.width, header.height};
}

// The pixels of a picture turned clockwise by a quarter.
Bytes turnedByQuarter(const DecodedPicture& picture) {
  Bytes turned;
  for (std::uint32_t y = 0; y < picture.width; ++y) {
    for (std::uint32_t x = 0; x < picture.height; ++x) {
      const std::uint8_t* p =
          picture.pixels.get() + ((picture.height - 1 - x) * std::size_t{picture.width} + y) * 4;
      turned.insert(turned.end(), p, p + 4);
    }
  }
  return turned;
}

TEST(RotateJpeg, TurnsClockwise) {
  const Bytes file = makeJpeg({.width = 64, .height = 48});
  const Bytes expected = turnedByQuarter(decodeJpeg(file));
  const Bytes turned = rotateJpeg(file, 90);
  EXPECT_EQ(sizeOf(turned), (Size{48, 64}));
  // The inverse transform rounds rows and columns one after the other, hence not equal.
  EXPECT_LT(
      test_support::meanDifference(rgbaBytes(decodeJpeg(turned)).data(), expected.data(), 64 * 48),
      1.0);
}

TEST(RotateJpeg, FourTimesByAQuarterIsTheSamePicture) {
  const std::vector<JpegRecipe> recipes = {
      {.width = 64, .height = 48},
      {.width = 64, .height = 48, .horizontalSampling = 2, .verticalSampling = 1},
      {.width = 64, .height = 48, .horizontalSampling = 1, .verticalSampling = 2},
      {.width = 24, .height = 16, .horizontalSampling = 1, .verticalSampling = 1},
      {.width = 24, .height = 16, .samples = JCS_GRAYSCALE, .stored = JCS_GRAYSCALE},
      {.width = 32, .height = 16, .samples = JCS_CMYK, .stored = JCS_YCCK},
      {.width = 64, .height = 48, .scans = test_support::completeProgressiveScans()},
      {.width = 64, .height = 48, .restartInterval = 3}};
  for (const JpegRecipe& recipe : recipes) {
    const Bytes file = makeJpeg(recipe);
    Bytes turned = file;
    for (int i = 0; i < 4; ++i) turned = rotateJpeg(turned, 90);
    EXPECT_EQ(rgbaBytes(decodeJpeg(turned)), rgbaBytes(decodeJpeg(file)));
    EXPECT_EQ(rgbaBytes(decodeJpeg(rotateJpeg(rotateJpeg(file, 90), 270))),
              rgbaBytes(decodeJpeg(file)));
    EXPECT_EQ(rotateJpeg(rotateJpeg(file, 90), 90), rotateJpeg(file, 180));
  }
}

TEST(RotateJpeg, TakesDegreesModuloAFullTurn) {
  const Bytes file = makeJpeg({.width = 32, .height = 16});
  const std::map<int, std::vector<int>> equals = {
      {90, {450, -270, -630}}, {180, {-180, 540}}, {270, {-90, 630}}};
  for (const auto& [degrees, others] : equals) {
    for (const int other : others) EXPECT_EQ(rotateJpeg(file, other), rotateJpeg(file, degrees));
  }
}

TEST(RotateJpeg, ByFullTurnsGivesTheSameBytes) {
  Bytes file = makeJpeg({.width = 37, .height = 21});
  file.push_back('x');  // after the end mark
  for (const int degrees : {0, 360, -360, 720}) EXPECT_EQ(rotateJpeg(file, degrees), file);
}

TEST(RotateJpeg, RefusesOtherAngles) {
  const Bytes file = makeJpeg({});
  for (const int degrees : {1, 45, -1, 91, INT_MAX, INT_MIN}) {
    EXPECT_THAT(jpegErrorOf([&] { rotateJpeg(file, degrees); }),
                testing::StartsWith("a JPEG file turns by multiples of 90 degrees"));
  }
}

TEST(RotateJpeg, TrimsThePartialBlocksThatCannotMove) {
  const Bytes file = makeJpeg({.width = 37, .height = 21});  // blocks of 16 x 16
  EXPECT_EQ(sizeOf(rotateJpeg(file, 90)), (Size{16, 37}));
  EXPECT_EQ(sizeOf(rotateJpeg(file, 180)), (Size{32, 16}));
  EXPECT_EQ(sizeOf(rotateJpeg(file, 270)), (Size{21, 32}));
}

TEST(RotateJpeg, KeepsAPictureThatIsSmallerThanABlock) {
  const Bytes file = makeJpeg({.width = 10, .height = 6});
  EXPECT_EQ(sizeOf(rotateJpeg(file, 90)), (Size{6, 10}));
  EXPECT_EQ(sizeOf(rotateJpeg(file, 180)), (Size{10, 6}));
  EXPECT_EQ(sizeOf(rotateJpeg(makeJpeg({.width = 1, .height = 1}), 270)), (Size{1, 1}));
}

TEST(RotateJpeg, KeepsMetadataByteForByte) {
  const std::vector<MetadataSegment> metadata = {
      {0xE1, {'x', 'm', 'p'}}, {0xED, Bytes(65533, 0xFF)}, {0xFE, {'c', 0}}};
  const Bytes file = makeJpeg({.metadata = metadata, .profile = Bytes(100'000, 3)});
  const JpegHeader before = readJpegHeader(file), after = readJpegHeader(rotateJpeg(file, 90));
  ASSERT_EQ(after.metadata.size(), before.metadata.size());
  for (std::size_t i = 0; i < after.metadata.size(); ++i) {
    EXPECT_EQ(after.metadata[i].marker, before.metadata[i].marker);
    EXPECT_EQ(after.metadata[i].payload, before.metadata[i].payload);
  }
}

TEST(RotateJpeg, LeavesAProgressiveFileProgressive) {
  const Bytes file = makeJpeg({.scans = test_support::completeProgressiveScans()});
  EXPECT_TRUE(readJpegHeader(rotateJpeg(file, 90)).progressive);
  EXPECT_FALSE(readJpegHeader(rotateJpeg(makeJpeg({}), 90)).progressive);
}

TEST(RotateJpeg, HonoursTheLimits) {
  for (const int degrees : {0, 90}) {
    const Bytes manyScans = makeJpeg({.scans = test_support::progressiveScans(500)});
    EXPECT_EQ(jpegErrorOf([&] { rotateJpeg(manyScans, degrees); }),
              "too many scans: at most 100 can be read");
    const Bytes huge = test_support::withSize(makeJpeg({}), 65500, 65500);
    EXPECT_THAT(jpegErrorOf([&] { rotateJpeg(huge, degrees); }), testing::StartsWith("too large"));
    EXPECT_THROW(rotateJpeg(makeJpeg({}), degrees, {.pixels = 100}), JpegError);
  }
}

TEST(RotateJpeg, SaysWhenTheSubsamplingIsUnusual) {
  const Bytes file = makeJpeg({.horizontalSampling = 4, .verticalSampling = 2});
  EXPECT_THAT(jpegErrorOf([&] { rotateJpeg(file, 90); }),
              testing::StartsWith("cannot be turned without loss: "));
  EXPECT_NO_THROW(decodeJpeg(file));
}

}  // namespace
}  // namespace pelorin::imgproc
