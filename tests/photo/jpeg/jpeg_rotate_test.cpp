#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <climits>
#include <map>
#include <utility>

#include "tests/support/jpeg_files.h"

namespace pelorin::photo {
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

struct Pixels {
  Size size;
  Bytes rgba;
};

Pixels upperLeftOf(const DecodedPicture& picture, const Size& size) {
  Pixels part = {size, {}};
  for (std::size_t y = 0; y < size.second; ++y) {
    const std::uint8_t* row = picture.pixels.get() + y * picture.width * 4;
    part.rgba.insert(part.rgba.end(), row, row + std::size_t{size.first} * 4);
  }
  return part;
}

Pixels turnedByQuarter(const Pixels& pixels) {
  const auto [width, height] = pixels.size;
  Pixels turned = {{height, width}, {}};
  for (std::uint32_t y = 0; y < width; ++y) {
    for (std::uint32_t x = 0; x < height; ++x) {
      const std::uint8_t* p = pixels.rgba.data() + ((height - 1 - x) * std::size_t{width} + y) * 4;
      turned.rgba.insert(turned.rgba.end(), p, p + 4);
    }
  }
  return turned;
}

// Files of every kind; sizes are the caller's.
std::vector<JpegRecipe> recipes() {
  std::vector<JpegRecipe> all = {
      {.samples = JCS_GRAYSCALE, .stored = JCS_GRAYSCALE},
      {.stored = JCS_RGB, .horizontalSampling = 1, .verticalSampling = 1},
      {.samples = JCS_CMYK, .stored = JCS_YCCK},
      {.samples = JCS_CMYK, .stored = JCS_CMYK, .adobe = false},
      {.restartInterval = 3},
      {.arithmetic = true},
      {.scans = test_support::completeProgressiveScans()},
      {.scans = test_support::channelScans()}};
  for (const auto& [across, down] :
       {std::pair{1, 1}, {2, 1}, {1, 2}, {2, 2}, {4, 1}, {1, 4}, {4, 2}})
    all.push_back({.horizontalSampling = across, .verticalSampling = down});
  return all;
}

TEST(RotateJpeg, TurnsClockwiseAllThatIsWhole) {
  for (JpegRecipe recipe : recipes()) {
    const bool grey = recipe.stored == JCS_GRAYSCALE;
    const std::uint32_t unitWidth = grey ? 8 : 8 * recipe.horizontalSampling;
    const std::uint32_t unitHeight = grey ? 8 : 8 * recipe.verticalSampling;
    for (const auto& [width, height] : {Size{64, 96}, {75, 64}, {64, 71}, {83, 101}}) {
      recipe.width = width;
      recipe.height = height;
      const Bytes file = makeJpeg(recipe);
      const DecodedPicture original = decodeJpeg(file);
      for (const int degrees : {90, 180, 270}) {
        // What comes first in a direction that is reversed has to be whole.
        Pixels expected =
            upperLeftOf(original, {degrees == 90 ? width : width / unitWidth * unitWidth,
                                   degrees == 270 ? height : height / unitHeight * unitHeight});
        for (int i = 0; i < degrees / 90; ++i) expected = turnedByQuarter(expected);
        const DecodedPicture turned = decodeJpeg(rotateJpeg(file, degrees));
        ASSERT_EQ((Size{turned.width, turned.height}), expected.size);
        // The inverse transform rounds rows and columns one after the other, hence not equal.
        EXPECT_LT(test_support::meanDifference(turned.pixels.get(), expected.rgba.data(),
                                               expected.rgba.size() / 4),
                  1.0)
            << width << " x " << height << ", " << degrees << " degrees, sampled by "
            << recipe.horizontalSampling << " x " << recipe.verticalSampling;
      }
    }
  }
}

TEST(RotateJpeg, FourTimesByAQuarterIsTheSamePicture) {
  for (JpegRecipe recipe : recipes()) {
    recipe.width = 64;
    recipe.height = 96;
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

TEST(RotateJpeg, CodesAPictureAnewOfWhichNothingCanBeMoved) {
  for (JpegRecipe recipe : recipes()) {
    for (const auto& [width, height] : {Size{10, 6}, {7, 90}, {90, 5}, {1, 1}}) {
      recipe.width = width;
      recipe.height = height;
      const Bytes file = makeJpeg(recipe);
      for (const int degrees : {90, 180, 270}) {
        if (degrees == 90 ? height >= 8 : degrees == 270 && width >= 8) continue;
        Pixels expected = upperLeftOf(decodeJpeg(file), {width, height});
        for (int i = 0; i < degrees / 90; ++i) expected = turnedByQuarter(expected);
        const DecodedPicture turned = decodeJpeg(rotateJpeg(file, degrees));
        ASSERT_EQ((Size{turned.width, turned.height}), expected.size);
        EXPECT_LT(test_support::meanDifference(turned.pixels.get(), expected.rgba.data(),
                                               expected.rgba.size() / 4),
                  1.0)
            << width << " x " << height << ", " << degrees << " degrees";
      }
    }
  }
}

TEST(RotateJpeg, KeepsMetadataByteForByte) {
  const std::vector<MetadataSegment> metadata = {
      {0xE1, {'x', 'm', 'p'}}, {0xED, Bytes(65533, 0xFF)}, {0xFE, {'c', 0}}};
  for (const Size& size : {Size{32, 24}, {5, 5}}) {
    const Bytes file = makeJpeg({.width = size.first,
                                 .height = size.second,
                                 .metadata = metadata,
                                 .profile = Bytes(100'000, 3)});
    const JpegHeader before = readJpegHeader(file), after = readJpegHeader(rotateJpeg(file, 90));
    ASSERT_EQ(after.metadata.size(), before.metadata.size());
    for (std::size_t i = 0; i < after.metadata.size(); ++i) {
      EXPECT_EQ(after.metadata[i].marker, before.metadata[i].marker);
      EXPECT_EQ(after.metadata[i].payload, before.metadata[i].payload);
    }
  }
}

TEST(RotateJpeg, LeavesAProgressiveFileProgressive) {
  const Bytes file = makeJpeg({.scans = test_support::completeProgressiveScans()});
  EXPECT_TRUE(readJpegHeader(rotateJpeg(file, 90)).coding.progressive);
  EXPECT_FALSE(readJpegHeader(rotateJpeg(makeJpeg({}), 90)).coding.progressive);
}

TEST(RotateJpeg, HonoursTheLimits) {
  for (const int degrees : {0, 90}) {
    const Bytes manyScans = makeJpeg({.scans = test_support::progressiveScans(500)});
    EXPECT_EQ(jpegErrorOf([&] { rotateJpeg(manyScans, degrees); }),
              "too many scans: at most 100 can be read");
    const Bytes huge = test_support::withSize(makeJpeg({}), 65500, 65500);
    EXPECT_THAT(jpegErrorOf([&] { rotateJpeg(huge, degrees); }), testing::StartsWith("too large"));
    EXPECT_THROW(rotateJpeg(makeJpeg({}), degrees, {.pixels = 100}), PhotoError);
  }
}

TEST(RotateJpeg, TakesCommonSamplingFactorsForNone) {
  // Each channel by 2 x 2 is as much as each by 1 x 1, and less has to be trimmed.
  Bytes file = makeJpeg({.width = 44,
                         .height = 28,
                         .horizontalSampling = 1,
                         .verticalSampling = 1,
                         .scans = test_support::channelScans()});
  for (const std::size_t channel : {0, 1, 2})
    file = test_support::withFrameByte(file, 9 + 3 * channel, 0x22);
  EXPECT_EQ(sizeOf(rotateJpeg(file, 180)), (Size{40, 24}));
}

}  // namespace
}  // namespace pelorin::photo
