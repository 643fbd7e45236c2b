// Files that are made to hurt: the whole way from bytes to bytes ends, with a picture and named
// losses or with a clear error. Counts and sizes are bounded by what is asked here, not by a clock.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <array>
#include <set>

#include "photo/jpeg/jpeg_codec.h"
#include "photo/metadata/mpf.h"
#include "photo/metadata/xmp_segments.h"
#include "photo/photo.h"
#include "tests/photo/metadata/phone_photos.h"
#include "tests/photo/metadata/xmp_texts.h"
#include "tests/support/pictures.h"

namespace pelorin::photo {
namespace {

using namespace std::string_literals;
using test_support::Bytes;
using test_support::bytesOf;
using test_support::cameraExif;
using test_support::jpegWith;
using test_support::photoLikePicture;
using test_support::xmpPacket;
using test_support::xmpSegment;

struct Result {
  bool opened = false;
  std::vector<Loss> lost;
};

// An error must be one of photo's, which say what is wrong.
Result outcomeOf(const Bytes& file, std::string_view format = "JPEG") {
  Result result;
  try {
    const Photo photo = open(file);
    result.opened = true;
    const Bytes written = save(*photo.image, format, photo.metadata, {}, &result.lost);
    EXPECT_EQ(readFacts(written).width, photo.image->width);
  } catch (const PhotoError& error) {
    EXPECT_FALSE(result.opened) << "what was read can be written: " << error.what();
    EXPECT_STRNE(error.what(), "");
  }
  return result;
}

Bytes withSegments(std::initializer_list<MetadataSegment> segments) {
  return jpegWith(photoLikePicture(8, 8, 1), segments);
}

std::string big(std::size_t value, int bytes) {
  std::string text;
  for (int shift = 8 * (bytes - 1); shift >= 0; shift -= 8)
    text += static_cast<char>(value >> shift & 255);
  return text;
}

TEST(HostileMetadata, CutAtEveryByteIsAnErrorOrAPicture) {
  const Bytes whole = test_support::joined(
      {withSegments({{0xE1, cameraExif({.thumbnail = jpegWith(photoLikePicture(8, 8, 2))})},
                     xmpSegment(xmpPacket("<rdf:Description tiff:Orientation='6'/>")),
                     {0xE2, writeMpf(std::vector<MpfEntry>{{mpfPrimary, 1, 0}, {0, 2, 3}})},
                     {0xED, bytesOf("Photoshop 3.0\0"s + "8BIM\x04\x04\0\0\0\0\0\2ab"s)}}),
       test_support::video()});
  std::size_t opened = 0;
  for (std::size_t size = 0; size < whole.size(); ++size)
    opened +=
        outcomeOf(Bytes(whole.begin(), whole.begin() + static_cast<std::ptrdiff_t>(size))).opened;
  EXPECT_EQ(opened, test_support::video().size());  // of the picture nothing may miss
}

TEST(HostileMetadata, EverySegmentCutAtEveryByteCostsNoPicture) {
  const std::string parts[] = {
      {reinterpret_cast<const char*>(cameraExif({}).data()), cameraExif({}).size()},
      "http://ns.adobe.com/xap/1.0/\0"s + xmpPacket("<rdf:Description tiff:Orientation='6'/>"),
      "http://ns.adobe.com/xmp/extension/\0"s + std::string(32, 'A') + big(9, 4) + big(0, 4),
      "Photoshop 3.0\0"s + "8BIM\x04\x0C\0\0\0\0\0\4old!"s,
      "JFIF\0\1\2\0\0\1\0\1\1\1abc"s,
      "ICC_PROFILE\0\1\1x"s};
  for (const std::string& part : parts) {
    for (std::size_t size = 0; size <= part.size(); size += 1 + size / 100) {
      for (const int marker : {0xE0, 0xE1, 0xE2, 0xED}) {
        const Bytes file =
            withSegments({{static_cast<std::uint8_t>(marker), bytesOf(part.substr(0, size))}});
        EXPECT_TRUE(outcomeOf(file).opened);
      }
    }
  }
}

// Big-endian TIFF with one directory of these entries: tag, type, count, value.
Bytes tiffOf(const std::vector<std::array<std::uint32_t, 4>>& entries, std::uint32_t next) {
  std::string tiff = "Exif\0\0MM\0*\0\0\0\x08"s + big(entries.size(), 2);
  for (const auto& [tag, type, count, value] : entries)
    tiff += big(tag, 2) + big(type, 2) + big(count, 4) + big(value, 4);
  return bytesOf(tiff + big(next, 4) + std::string(40, '\0'));
}

TEST(HostileMetadata, OffsetsBeyondTheEndAndLoopsLeadNowhere) {
  constexpr std::uint32_t everywhere[] = {0,  1,  7,          8,          9,
                                          30, 90, 0x7FFFFFFF, 0x80000000, 0xFFFFFFFF};
  for (const std::uint32_t place : everywhere) {
    for (const std::uint32_t count : {1u, 4u, 0x40000000u, 0xFFFFFFFFu}) {
      const Bytes exif = tiffOf({{0x0112, 4, count, place},
                                 {0x0201, 4, 1, place},
                                 {0x0202, 4, 1, count},
                                 {0x8769, 4, 1, place},
                                 {0x8825, 4, 1, place},
                                 {0x9214, 3, count, place}},
                                place);
      const Photo photo = open(withSegments({{0xE1, exif}}));
      for (const KeepOptions& keep :
           {KeepOptions{}, KeepOptions{.location = false},
            KeepOptions{.only = std::set{MetadataKind::copyright, MetadataKind::time}}})
        EXPECT_FALSE(save(*photo.image, "JPEG", photo.metadata, {.keep = keep}).empty());
    }
    Bytes index = writeMpf(std::vector<MpfEntry>{{mpfPrimary, place, place}, {0, place, place}});
    for (std::size_t at = 8; at < 12; ++at)  // the directory itself lies there
      index[at] = static_cast<std::uint8_t>(place >> 8 * (11 - at));
    EXPECT_TRUE(outcomeOf(withSegments({{0xE2, index}})).opened);
  }
}

TEST(HostileMetadata, BombsOfEntitiesAreNotUnfolded) {
  std::string bomb = "<!DOCTYPE x [<!ENTITY a 'aaaaaaaaaa'>";
  for (char name = 'b'; name < 'z'; ++name) {
    const std::string entity = std::string("&") + static_cast<char>(name - 1) + ";";
    bomb += std::string("<!ENTITY ") + name + " '";
    for (int i = 0; i < 10; ++i) bomb += entity;
    bomb += "'>";
  }
  bomb += "]>" + xmpPacket("<rdf:Description my:Thing='&y;'/>");
  const Result result = outcomeOf(withSegments({xmpSegment(bomb)}));
  EXPECT_EQ(result.lost, (std::vector<Loss>{{"XMP", "declares a document type"}}));
}

TEST(HostileMetadata, OfAHundredMegabytesOfXmpNothingIsParsed) {
  const std::string name(32, 'A');
  std::vector<MetadataSegment> segments = {
      xmpSegment(xmpPacket("<rdf:Description xmpNote:HasExtendedXMP='" + name + "'/>"))};
  constexpr std::size_t part = 65000, total = 100'000'000;
  for (std::size_t at = 0; at < total; at += part) {
    segments.push_back({0xE1, bytesOf("http://ns.adobe.com/xmp/extension/\0"s + name +
                                      big(total, 4) + big(at, 4))});
    segments.back().payload.resize(segments.back().payload.size() + part, ' ');
  }
  std::vector<Loss> lost;
  editXmp(
      segments, [](const XmpPacket&) {}, lost);
  EXPECT_EQ(lost, (std::vector<Loss>{{"Extended XMP", "over 64 MiB"}}));
  EXPECT_EQ(segments.size(), 1u);
  // As PNG files may have it: one packet.
  segments[0].payload.resize(total, ' ');
  editXmp(
      segments, [](const XmpPacket&) {}, lost);
  EXPECT_EQ(lost.at(1), (Loss{"XMP", "over 64 MiB"}));
  EXPECT_TRUE(segments.empty());
}

TEST(HostileMetadata, OfAPacketThatIsAllLargePropertiesFewMove) {
  std::string properties;
  for (int i = 0; i < 3000; ++i) properties += "<my:Thing>" + std::string(150, 'x') + "</my:Thing>";
  std::vector<MetadataSegment> segments = {
      xmpSegment(xmpPacket("<rdf:Description>" + properties + "</rdf:Description>"))};
  std::vector<Loss> lost;
  editXmp(
      segments, [](const XmpPacket&) {}, lost);
  EXPECT_EQ(lost, (std::vector<Loss>{{"XMP", "too large for its segment"}}));
}

TEST(HostileMetadata, OfSixtyFiveThousandSegmentsIsReadOrRefused) {
  const Bytes picture = withSegments({});
  for (const std::string& payload :
       {"x"s, "Exif\0\0MM\0*\0\0\0\x08\0\0"s,
        "http://ns.adobe.com/xmp/extension/\0"s + std::string(32, 'A') + big(9, 4) + big(0, 4)}) {
    const Bytes segment = bytesOf("\xFF\xE1" + big(payload.size() + 2, 2) + payload);
    Bytes file(picture.begin(), picture.begin() + 2);
    for (int i = 0; i < 65'535; ++i) file.insert(file.end(), segment.begin(), segment.end());
    file.insert(file.end(), picture.begin() + 2, picture.end());
    EXPECT_FALSE(outcomeOf(file).opened);
    EXPECT_THROW(readJpegHeader(file), PhotoError);
  }
}

TEST(HostileMetadata, OfFourThousandSegmentsIsKept) {
  std::vector<MetadataSegment> segments(4000, {0xE1, bytesOf("x")});
  const Result result = outcomeOf(jpegWith(photoLikePicture(8, 8, 1), segments));
  EXPECT_TRUE(result.opened);
  EXPECT_TRUE(result.lost.empty());
}

TEST(HostileMetadata, OfSegmentsBehindThePictureDataIsLeftThere) {
  Bytes file = withSegments({});
  const Bytes segment = bytesOf("\xFF\xE1\0\3x"s);
  file.resize(file.size() - 2);  // the end mark
  for (int i = 0; i < 65'535; ++i) file.insert(file.end(), segment.begin(), segment.end());
  file.insert(file.end(), {0xFF, 0xD9});
  EXPECT_TRUE(outcomeOf(file).opened);
}

}  // namespace
}  // namespace pelorin::photo
