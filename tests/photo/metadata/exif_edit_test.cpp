#include "photo/metadata/exif_edit.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>

#include "photo/area_average.h"
#include "photo/jpeg/jpeg_codec.h"
#include "photo/metadata/exif_orientation.h"
#include "photo/metadata/tiff.h"
#include "tests/photo/metadata/exif_segments.h"
#include "tests/support/pictures.h"

namespace pelorin::photo {
namespace {

using image_processing::Image;
using image_processing::RGBA8Pixel;
using test_support::Bytes;
using test_support::cameraExif;
using test_support::CameraExif;
using test_support::photoLikePicture;

constexpr PictureChange quarterTurn = {{400, 300}, {300, 400}, {false, 1}, 6};

Bytes jpegOf(const Image<RGBA8Pixel>& picture, int quality = 90) {
  return encodeJpeg(reinterpret_cast<const std::uint8_t*>(picture.data.get()), picture.width,
                    picture.height, quality);
}

struct Edited {
  Bytes payload;
  std::vector<Loss> lost;
};

Edited edited(Bytes payload, const Image<RGBA8Pixel>& picture, const PictureChange& change) {
  Edited result = {std::move(payload), {}};
  ThumbnailMaker thumbnails(picture);
  editExif(result.payload, change, &thumbnails, result.lost);
  return result;
}

std::uint32_t numberIn(Bytes payload, std::uint16_t tag, std::uint32_t index = 0) {
  const Tiff tiff(std::span<std::uint8_t>(payload).subspan(6));
  const TiffDirectory first = tiff.firstDirectory();
  for (const TiffDirectory& directory :
       {first, tiff.directoryOf(first.find(0x8769)), tiff.nextDirectory(first)}) {
    if (const TiffEntry* entry = directory.find(tag)) return tiff.number(*entry, index);
  }
  ADD_FAILURE() << "no tag " << tag;
  return 0;
}

Bytes thumbnailIn(Bytes payload) {
  const Tiff tiff(std::span<std::uint8_t>(payload).subspan(6));
  const TiffDirectory second = tiff.nextDirectory(tiff.firstDirectory());
  if (second.find(0x0201) == nullptr) return {};
  const auto begin = payload.begin() + 6 + tiff.number(*second.find(0x0201));
  return {begin, begin + tiff.number(*second.find(0x0202))};
}

// Of red, green and blue, in levels.
double rootMeanSquare(const Image<RGBA8Pixel>& a, const DecodedPicture& b) {
  double sum = 0;
  const std::size_t pixels = std::size_t{a.width} * a.height;
  for (std::size_t i = 0; i < pixels; ++i) {
    const RGBA8Pixel& p = a.data.get()[i];
    const std::uint8_t* q = b.pixels.get() + 4 * i;
    sum += std::pow(p.r - q[0], 2) + std::pow(p.g - q[1], 2) + std::pow(p.b - q[2], 2);
  }
  return std::sqrt(sum / (3.0 * pixels));
}

TEST(ExifEdit, StatesTheUprightPictureAndItsSizeInBothByteOrders) {
  const Image<RGBA8Pixel> picture = photoLikePicture(300, 400, 1);
  for (const bool littleEndian : {false, true}) {
    const Bytes before = cameraExif({.littleEndian = littleEndian});
    const Edited result = edited(before, picture, quarterTurn);
    EXPECT_TRUE(result.lost.empty());
    EXPECT_EQ(
        result.payload,
        cameraExif({.littleEndian = littleEndian, .orientation = 1, .width = 300, .height = 400}))
        << "and nothing else";
  }
}

TEST(ExifEdit, TurnsTheSubject) {
  const Image<RGBA8Pixel> picture = photoLikePicture(300, 400, 1);
  for (const bool littleEndian : {false, true}) {
    const Edited area =
        edited(cameraExif({.littleEndian = littleEndian, .subjectArea = {240, 75, 80, 30}}),
               picture, quarterTurn);
    // (0.6, 0.25) of the stored picture is (0.75, 0.6) of the upright one.
    EXPECT_EQ(numberIn(area.payload, 0x9214, 0), 225u);
    EXPECT_EQ(numberIn(area.payload, 0x9214, 1), 240u);
    EXPECT_EQ(numberIn(area.payload, 0x9214, 2), 30u);
    EXPECT_EQ(numberIn(area.payload, 0x9214, 3), 80u);
    const Edited point =
        edited(cameraExif({.littleEndian = littleEndian, .subjectArea = {240, 75}}), picture,
               {{400, 300}, {150, 200}, {false, 1}, 6});
    EXPECT_EQ(numberIn(point.payload, 0x9214, 0), 113u);
    EXPECT_EQ(numberIn(point.payload, 0x9214, 1), 120u);
  }
}

TEST(ExifEdit, RendersTheThumbnailAnewAtItsSizeClass) {
  const Image<RGBA8Pixel> picture = photoLikePicture(1500, 2000, 1);
  const PictureChange change = {{2000, 1500}, {1500, 2000}, {false, 1}, 6};
  const Bytes old = jpegOf(photoLikePicture(160, 120, 9));
  for (const bool behind : {false, true}) {
    const Bytes before = cameraExif({.thumbnail = old, .noteBehindThumbnail = behind});
    const Edited result = edited(before, picture, change);
    EXPECT_TRUE(result.lost.empty());
    const Bytes file = thumbnailIn(result.payload);
    const DecodedPicture thumbnail = decodeJpeg(file);
    EXPECT_EQ(thumbnail.width, 120u);
    EXPECT_EQ(thumbnail.height, 160u);
    EXPECT_LT(rootMeanSquare(areaAverage(picture, {120, 160}), thumbnail), behind ? 6.0 : 3.0)
        << "in the room of the old one as well as that allows";
    EXPECT_EQ(file[2], 0xFF);
    EXPECT_EQ(file[3], 0xDB) << "a thumbnail has no application segments";
    EXPECT_EQ(numberIn(result.payload, 0xEEEE), 0xDEADBEEF);
    if (behind) {
      EXPECT_EQ(result.payload.size(), before.size()) << "the maker note does not move";
      EXPECT_TRUE(std::equal(before.end() - 8, before.end(), result.payload.end() - 8));
    }
  }
}

TEST(ExifEdit, RemovesAThumbnailThatHasNoRoom) {
  const Image<RGBA8Pixel> picture = photoLikePicture(300, 400, 1);
  const Bytes tiny = jpegOf(test_support::flatPicture(160, 120, {9, 9, 9, 255}), 1);
  const Bytes before = cameraExif({.thumbnail = tiny, .noteBehindThumbnail = true});
  const Edited result = edited(before, picture, quarterTurn);
  ASSERT_EQ(result.lost.size(), 1u);
  EXPECT_EQ(result.lost[0].what, "EXIF thumbnail");
  EXPECT_TRUE(thumbnailIn(result.payload).empty());
  EXPECT_EQ(
      std::search(result.payload.begin(), result.payload.end(), tiny.begin() + 20, tiny.end()),
      result.payload.end());
  EXPECT_EQ(result.payload.size(), before.size());
  EXPECT_EQ(exifOrientation(result.payload), 1);
}

TEST(ExifEdit, FitsItsSegmentWhereverTheThumbnailBegins) {
  constexpr std::size_t longest = 65533;
  const Image<RGBA8Pixel> picture = test_support::flatPicture(16, 16, {9, 9, 9, 255});
  const Bytes old = {0xFF, 0xD8, 0xFF, 0xD9};
  const std::size_t others = cameraExif({.makerNote = {}, .thumbnail = old}).size();
  int fitted = 0, removed = 0;
  for (std::size_t free = 0; free < 1200; free += 5) {
    const Bytes before =
        cameraExif({.makerNote = Bytes(longest - others - free), .thumbnail = old});
    ASSERT_EQ(before.size(), longest - free);
    const Edited result = edited(before, picture, {{16, 16}, {16, 16}, {}, 6});
    EXPECT_LE(result.payload.size(), longest);
    EXPECT_EQ(result.lost.empty(), !thumbnailIn(result.payload).empty());
    (result.lost.empty() ? fitted : removed) += 1;
  }
  EXPECT_GT(fitted, 0);
  EXPECT_GT(removed, 0);
}

TEST(ExifEdit, FollowsPointersOfTheTypeForDirectories) {
  constexpr std::uint8_t directoryType = 13;
  const auto withPointer = [](Bytes payload, const std::uint8_t(&entry)[4]) {
    const auto place = std::search(payload.begin(), payload.end(), entry, entry + 4);
    EXPECT_NE(place, payload.end());
    *(place + (entry[2] == 4 ? 2 : 3)) = directoryType;
    return payload;
  };
  const std::uint8_t little[] = {0x69, 0x87, 4, 0}, big[] = {0x87, 0x69, 0, 4};
  const Image<RGBA8Pixel> picture = photoLikePicture(300, 400, 1);
  for (const bool littleEndian : {false, true}) {
    const Bytes payload =
        withPointer(cameraExif({.littleEndian = littleEndian}), littleEndian ? little : big);
    const Edited result = edited(payload, picture, quarterTurn);
    EXPECT_EQ(numberIn(result.payload, 0xA002), 300u);
    EXPECT_EQ(numberIn(result.payload, 0xA003), 400u);
  }
}

TEST(ExifEdit, SurvivesASegmentCutAnywhere) {
  const Image<RGBA8Pixel> picture = photoLikePicture(30, 40, 1);
  const Bytes whole = cameraExif({.subjectArea = {1, 2, 3},
                                  .thumbnail = jpegOf(photoLikePicture(16, 12, 9)),
                                  .noteBehindThumbnail = true});
  for (std::size_t size = 0; size < whole.size(); ++size) {
    const Edited result = edited({whole.begin(), whole.begin() + static_cast<std::ptrdiff_t>(size)},
                                 picture, {{40, 30}, {30, 40}, {false, 1}, 6});
    EXPECT_EQ(exifOrientation(result.payload), 1);
  }
}

TEST(ExifEdit, SurvivesOffsetsAndCountsBeyondTheSegmentAndLoops) {
  const Image<RGBA8Pixel> picture = photoLikePicture(30, 40, 1);
  const Bytes whole = cameraExif({.subjectArea = {1, 2, 3},
                                  .thumbnail = jpegOf(photoLikePicture(16, 12, 9)),
                                  .noteBehindThumbnail = true});
  for (std::size_t place = 6; place + 4 <= std::min<std::size_t>(whole.size(), 240); ++place) {
    for (const std::uint32_t hostile : {0u, 8u, 9u, 60u, 0xFFFFFFFFu, 0x7FFFFFFFu, 0x80000000u,
                                        0xFFFFFFF0u, static_cast<std::uint32_t>(whole.size() - 6),
                                        static_cast<std::uint32_t>(whole.size() - 7)}) {
      Bytes payload = whole;
      for (int i = 0; i < 4; ++i) payload[place + i] = static_cast<std::uint8_t>(hostile >> 8 * i);
      const Edited result = edited(payload, picture, {{40, 30}, {30, 40}, {false, 1}, 6});
      EXPECT_LE(result.payload.size(), 65533u);
    }
  }
}

}  // namespace
}  // namespace pelorin::photo
