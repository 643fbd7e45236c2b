// Files that are cut, changed or padded: each gives one error or the whole picture.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>

#include "tests/support/jpeg_files.h"

namespace pelorin::photo {
namespace {

using test_support::Bytes;
using test_support::findSegment;
using test_support::jpegErrorOf;
using test_support::JpegRecipe;
using test_support::makeJpeg;
using test_support::rgbaBytes;

std::vector<JpegRecipe> everyKind() {
  return {{},
          {.samples = JCS_GRAYSCALE, .stored = JCS_GRAYSCALE},
          {.samples = JCS_CMYK, .stored = JCS_YCCK},
          {.restartInterval = 1},
          {.arithmetic = true},
          {.scans = test_support::channelScans()},
          {.scans = test_support::progressiveScans(30)}};
}

TEST(DamagedJpeg, FailsWhenCutAtAnyByte) {
  for (const JpegRecipe& recipe : everyKind()) {
    const Bytes file = makeJpeg(recipe);
    ASSERT_NO_THROW(decodeJpeg(file));
    for (std::size_t size = 0; size < file.size(); ++size) {
      // A copy of its own, so that a sanitizer sees a read past the cut.
      const Bytes cut(file.begin(), file.begin() + static_cast<std::ptrdiff_t>(size));
      ASSERT_THROW(decodeJpeg(cut), PhotoError) << size << " of " << file.size() << " bytes";
      ASSERT_THROW(decodeJpeg(cut, 8), PhotoError) << size << " of " << file.size() << " bytes";
      ASSERT_THROW(rotateJpeg(cut, 90), PhotoError) << size << " of " << file.size() << " bytes";
      ASSERT_THROW(rotateJpeg(cut, 0), PhotoError) << size << " of " << file.size() << " bytes";
    }
  }
}

TEST(DamagedJpeg, SaysThatItIsTruncated) {
  Bytes file = makeJpeg({});
  file.erase(file.end() - 40, file.end());
  for (const auto& error :
       {jpegErrorOf([&] { decodeJpeg(file); }), jpegErrorOf([&] { rotateJpeg(file, 90); })}) {
    EXPECT_EQ(error, "truncated: the picture data ends early");
  }
}

TEST(DamagedJpeg, FailsWhenTheDataEndsEarlyBeforeTheEndMark) {
  Bytes file = makeJpeg({});
  file.erase(file.end() - 60, file.end() - 2);
  EXPECT_EQ(jpegErrorOf([&] { decodeJpeg(file); }), "damaged: premature end of data segment");
  EXPECT_EQ(jpegErrorOf([&] { rotateJpeg(file, 90); }), "damaged: premature end of data segment");
}

TEST(DamagedJpeg, FailsWhenAChannelNeverCame) {
  Bytes file = makeJpeg({.scans = test_support::channelScans()});
  file.erase(file.begin() + static_cast<std::ptrdiff_t>(findSegment(file, 0xDA, 2)),
             file.end() - 2);
  EXPECT_EQ(jpegErrorOf([&] { decodeJpeg(file); }), "truncated: a colour channel is missing");
  EXPECT_EQ(jpegErrorOf([&] { rotateJpeg(file, 0); }), "truncated: a colour channel is missing");
}

TEST(DamagedJpeg, FailsWhenARestartMarkIsMissing) {
  Bytes file = makeJpeg({.restartInterval = 1});
  const std::size_t mark = findSegment(file, 0xD1);
  file.erase(file.begin() + static_cast<std::ptrdiff_t>(mark),
             file.begin() + static_cast<std::ptrdiff_t>(mark) + 2);
  EXPECT_THROW(decodeJpeg(file), PhotoError);
  EXPECT_THROW(rotateJpeg(file, 90), PhotoError);
}

TEST(DamagedJpeg, MayHoldAnythingAfterItsEnd) {
  const Bytes file = makeJpeg({});
  Bytes longer = file;
  const Bytes other = makeJpeg({.scans = test_support::progressiveScans(500)});
  longer.insert(longer.end(), other.begin(), other.end());
  EXPECT_EQ(rgbaBytes(decodeJpeg(longer)), rgbaBytes(decodeJpeg(file)));
  EXPECT_EQ(rotateJpeg(longer, 90), rotateJpeg(file, 90));
}

TEST(DamagedJpeg, MayHoldStrayBytesAfterACompleteScan) {
  const Bytes file = makeJpeg({});
  Bytes longer = file;
  longer.insert(longer.end() - 2, {0, 0, 0, 0});
  EXPECT_EQ(rgbaBytes(decodeJpeg(longer)), rgbaBytes(decodeJpeg(file)));
  EXPECT_EQ(rotateJpeg(longer, 90), rotateJpeg(file, 90));
}

TEST(DamagedJpeg, IsTruncatedWhereItHasMoreBlocksThanBits) {
  const Bytes file = makeJpeg({});
  const Bytes wide = test_support::withSize(file, 16000, 16000);
  ASSERT_LT(wide.size() * 8, 2000u * 2000u);
  EXPECT_EQ(jpegErrorOf([&] { decodeJpeg(wide); }), "truncated: the picture data ends early");
  EXPECT_EQ(jpegErrorOf([&] { rotateJpeg(wide, 90); }), "truncated: the picture data ends early");
}

TEST(DamagedJpeg, IsRefusedForManyPixelsOfFewBytesWhereSymbolsTakeLessThanABit) {
  const Bytes wide = test_support::withSize(makeJpeg({.arithmetic = true}), 16000, 16000);
  EXPECT_EQ(jpegErrorOf([&] { decodeJpeg(wide); }),
            "too large: 16000 x 16000 pixels in a file of this size");
}

TEST(DamagedJpeg, IsRefusedForMoreSegmentsThanTheLimit) {
  const Bytes file = makeJpeg({});  // with JFIF's
  DecodeLimits limits = {.segments = 0};
  EXPECT_EQ(jpegErrorOf([&] { decodeJpeg(file, 1, limits); }),
            "too many segments: at most 0 can be read");
  EXPECT_EQ(jpegErrorOf([&] { rotateJpeg(file, 90, limits); }),
            "too many segments: at most 0 can be read");
}

TEST(DamagedJpeg, IsRefusedForTheWorkOfItsScansWhateverItsSize) {
  const Bytes file = makeJpeg({.scans = test_support::progressiveScans(60)});
  DecodeLimits limits;
  const JpegHeader header = readJpegHeader(file);
  limits.scannedPixels = 0;  // what the bytes allow is enough for any photo
  EXPECT_EQ(decodeJpeg(file, 1, limits).width, header.width);
  Bytes wide = test_support::withSize(file, 16000, 16000);
  wide.resize(wide.size() + 16000 * 16000 / 64 / 8 * 3);  // a bit for each block
  EXPECT_EQ(jpegErrorOf([&] { decodeJpeg(wide); }),
            "too many scans: 60 of 16000 x 16000 pixels in a file of this size");
}

TEST(DamagedJpeg, GivesAnErrorOrAPictureWhateverBytesChange) {
  test_support::Random random(/*seed=*/2024);
  const DecodeLimits limits = {.pixels = 1 << 20, .scans = 100};
  int refused = 0, read = 0;
  for (const JpegRecipe& recipe : everyKind()) {
    const Bytes file = makeJpeg(recipe);
    for (int run = 0; run < 500; ++run) {
      Bytes changed = file;
      for (std::uint32_t n = 1 + random.below(4); n > 0; --n) {
        changed[random.below(static_cast<std::uint32_t>(changed.size()))] =
            static_cast<std::uint8_t>(random.next32());
      }
      try {
        const JpegHeader header = readJpegHeader(changed);
        const int scale = 1 << random.below(4);
        const DecodedPicture picture = decodeJpeg(changed, scale, limits);
        const std::uint32_t divisor = static_cast<std::uint32_t>(scale);
        ASSERT_EQ(picture.width, (header.width + divisor - 1) / divisor);
        ASSERT_EQ(picture.height, (header.height + divisor - 1) / divisor);
        const Bytes pixels = rgbaBytes(picture);
        for (std::size_t i = 3; i < pixels.size(); i += 4) ASSERT_EQ(pixels[i], 255);
        rotateJpeg(changed, 90, limits);
        ++read;
      } catch (const PhotoError& error) {
        ASSERT_STRNE(error.what(), "");
        ++refused;
      }
    }
  }
  EXPECT_GT(refused, 100);
  EXPECT_GT(read, 100);
}

}  // namespace
}  // namespace pelorin::photo
