#include "photo/metadata/kept_metadata.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <string>

#include "photo/area_average.h"
#include "photo/jpeg/jpeg_codec.h"
#include "photo/jpeg/jpeg_end.h"
#include "photo/metadata/exif_orientation.h"
#include "photo/metadata/md5.h"
#include "photo/metadata/mpf.h"
#include "photo/metadata/xmp_regions.h"
#include "photo/metadata/xmp_segments.h"
#include "photo/photo.h"
#include "tests/photo/metadata/exif_segments.h"
#include "tests/photo/metadata/phone_photos.h"
#include "tests/photo/metadata/xmp_texts.h"
#include "tests/support/pictures.h"

namespace pelorin::photo {
namespace {

using namespace std::string_literals;
using image_processing::Image;
using image_processing::RGBA8Pixel;
using test_support::Bytes;
using test_support::bytesOf;
using test_support::cameraExif;
using test_support::gainMap;
using test_support::joined;
using test_support::jpegWith;
using test_support::phonePhoto;
using test_support::photoLikePicture;
using test_support::video;
using test_support::xmpPacket;
using test_support::xmpSegment;

struct Written {
  Bytes file;
  std::vector<Loss> lost;

  JpegHeader header() const { return readJpegHeader(file); }
  Bytes tail() const {
    return {file.begin() + static_cast<std::ptrdiff_t>(jpegEnd(file)), file.end()};
  }
  std::string text() const { return {file.begin(), file.end()}; }
};

Written rewritten(const Bytes& file, const OpenOptions& options = {},
                  const KeepOptions& keep = {}) {
  const Photo photo = open(file, options);
  Written written;
  written.file = save(*photo.image, "JPEG", photo.metadata, {.keep = keep}, &written.lost);
  return written;
}

MetadataSegment mpfOf(const JpegHeader& header) {
  for (const MetadataSegment& segment : header.metadata) {
    if (segment.marker == 0xE2 && isMpf(segment.payload)) return segment;
  }
  return {0, {}};
}

TEST(KeptMetadata, HasAGainMapWhereIndexAndContainerSay) {
  for (const bool iso : {false, true}) {
    const Bytes map = gainMap(iso);
    const Written written = rewritten(phonePhoto(1, joined({map, video()})));
    EXPECT_TRUE(written.lost.empty());
    EXPECT_EQ(written.tail(), joined({map, video()}));
    const std::vector<MpfEntry> entries = readMpf(mpfOf(written.header()).payload);
    ASSERT_EQ(entries.size(), 2u);
    EXPECT_EQ(entries[0].size, jpegEnd(written.file));
    EXPECT_EQ(entries[1].size, map.size());
    const std::size_t header = written.text().find("MPF\0"s) + 4;
    EXPECT_EQ(header + entries[1].offset, jpegEnd(written.file));
    EXPECT_THAT(written.text(), testing::HasSubstr("Item:Length=\"" + std::to_string(map.size())));
    EXPECT_THAT(written.text(),
                testing::HasSubstr("Item:Length=\"" + std::to_string(video().size())));
  }
}

void expectTurned(const DecodedPicture& turned, const Image<RGBA8Pixel>& before, int orientation) {
  const Turn turn = uprightTurn(orientation);
  ASSERT_EQ(turned.width, turn.swapsAxes() ? before.height : before.width);
  double difference = 0;
  for (std::uint32_t y = 0; y < turned.height; ++y) {
    for (std::uint32_t x = 0; x < turned.width; ++x) {
      const Turn::Place from = turn.sourceOf({y, x}, before.height, before.width);
      const int was = before.row(from.row)[from.column].g;
      difference += std::abs(was - turned.pixels.get()[4 * (y * turned.width + x) + 1]);
    }
  }
  EXPECT_LT(difference / (turned.width * turned.height), 6) << orientation;
}

TEST(KeptMetadata, TurnsAndScalesTheGainMapWithThePicture) {
  for (int orientation = 1; orientation <= 8; ++orientation) {
    for (const unsigned scale : {1u, 2u, 8u}) {
      const Written written =
          rewritten(phonePhoto(orientation, gainMap()), {.scale = static_cast<int>(scale)});
      const Bytes map = written.tail();
      EXPECT_TRUE(isGainMap(map));
      expectTurned(decodeJpeg(map),
                   areaAverage(photoLikePicture(32, 64, 5), {32 / scale, 64 / scale}), orientation);
      EXPECT_EQ(readJpegHeader(map).metadata, readJpegHeader(gainMap()).metadata);
      EXPECT_EQ(readMpf(mpfOf(written.header()).payload).at(1).size, map.size());
    }
  }
}

TEST(KeptMetadata, WithoutItsGainMapClaimsNone) {
  for (const bool dropped : {false, true}) {
    // Dropped by choice, or missing from the file.
    const Written written = dropped ? rewritten(phonePhoto(1, gainMap()), {}, {.gainMap = false})
                                    : rewritten(phonePhoto(1, {}));
    EXPECT_TRUE(written.tail().empty());
    for (const std::string& claim :
         {"MPF\0"s, "hdrgm:Version"s, "GainMap"s, "urn:iso:std:iso:ts:21496"s, "MotionPhoto"s})
      EXPECT_EQ(written.text().find(claim), std::string::npos) << claim;
  }
}

TEST(KeptMetadata, NamesSecondPicturesAndUnknownDataThatGo) {
  const Bytes preview = jpegWith(photoLikePicture(16, 16, 2));
  const Written written =
      rewritten(phonePhoto(1, joined({preview, {0, 0, 0}, bytesOf("what is this?")})));
  EXPECT_TRUE(written.tail().empty());
  ASSERT_EQ(written.lost.size(), 2u);
  EXPECT_EQ(written.lost[0].what, "second picture");
  EXPECT_EQ(written.lost[1].what, "data behind the picture");
}

TEST(KeptMetadata, NamesTheManifestThatAnEditBreaks) {
  const Bytes file = jpegWith(photoLikePicture(32, 32, 1),
                              {{0xEB, bytesOf("JP\0\1\0\0\0\1\0\0\0\x40jumb....c2pa"s)}});
  const Written written = rewritten(file);
  EXPECT_EQ(written.lost, (std::vector<Loss>{{"C2PA manifest", "an edit breaks its signature"}}));
  EXPECT_EQ(written.text().find("c2pa"), std::string::npos);
}

Bytes samsungTrailer(const std::string& data) {
  const std::string block = "\0\0\x30\x0A\x10\0\0\0MotionPhoto_Data"s + data;
  const auto little = [](std::size_t value) {
    return std::string{static_cast<char>(value), static_cast<char>(value >> 8), 0, 0};
  };
  const std::string table = "SEFH" + little(107) + little(1) + "\0\0\x30\x0A"s +
                            little(block.size()) + little(block.size());
  return bytesOf(block + table + little(table.size()) + "SEFT");
}

TEST(KeptMetadata, HasNoSamsungTrailerThatShowsThePictureAsItWas) {
  const Bytes shot = jpegWith(photoLikePicture(16, 16, 2));
  const Written written = rewritten(phonePhoto(6, samsungTrailer({shot.begin(), shot.end()})));
  EXPECT_EQ(written.lost, (std::vector<Loss>{{"Samsung trailer", "shows the picture as it was"}}));
  EXPECT_TRUE(written.tail().empty());
  EXPECT_EQ(written.text().find("MotionPhoto"), std::string::npos);
}

TEST(KeptMetadata, KeepsSamsungsTrailerAtTheEnd) {
  const Bytes trailer = samsungTrailer("film");
  const Written written = rewritten(phonePhoto(6, trailer));
  EXPECT_TRUE(written.lost.empty());
  EXPECT_EQ(written.tail(), trailer);
  EXPECT_THAT(written.text(), testing::HasSubstr("GCamera:MotionPhoto=\"1\""));
  EXPECT_THAT(written.text(), testing::HasSubstr("Item:Length=\"8\""));
}

TEST(KeptMetadata, RemovesThumbnailsThatShowThePictureAsItWas) {
  const Bytes jfif = bytesOf("JFIF\0\1\2\0\0\1\0\1\1\1abc"s);
  const Bytes resources = bytesOf("Photoshop 3.0\0"s + "8BIM\x04\x04\0\0\0\0\0\3abc\0"s +
                                  "8BIM\x04\x0C\0\0\0\0\0\4old!"s);
  const Written written =
      rewritten(jpegWith(photoLikePicture(32, 32, 1), {{0xE0, jfif}, {0xED, resources}}));
  EXPECT_EQ(written.lost.size(), 2u);
  const std::vector<MetadataSegment> segments = written.header().metadata;
  ASSERT_EQ(segments.size(), 2u);
  EXPECT_EQ(segments[0].payload, bytesOf("JFIF\0\1\2\0\0\1\0\1\0\0"s));
  EXPECT_EQ(segments[1].payload, bytesOf("Photoshop 3.0\0"s + "8BIM\x04\x04\0\0\0\0\0\3abc\0"s));
}

TEST(KeptMetadata, HasNoThumbnailOfPhotoshopsThatEndsWithoutItsPadding) {
  const Bytes resources = bytesOf("Photoshop 3.0\0"s + "8BIM\x04\x04\0\0\0\0\0\3abc\0"s +
                                  "8BIM\x04\x0C\0\0\0\0\0\3old"s);
  const Written written = rewritten(jpegWith(photoLikePicture(32, 32, 1), {{0xED, resources}}));
  EXPECT_EQ(written.lost,
            (std::vector<Loss>{{"Photoshop thumbnail", "shows the picture as it was"}}));
  EXPECT_EQ(written.text().find("old"), std::string::npos);
}

// A photo with a depth map, of which the extension holds the data.
Bytes depthPhoto(int orientation) {
  const auto description = [](const std::string& content) {
    return xmpPacket(
        "<rdf:Description xmlns:GDepth='http://ns.google.com/photos/1.0/depthmap/' "
        "xmlns:GFocus='http://ns.google.com/photos/1.0/focus/' " +
        content);
  };
  const std::string extension = description("GDepth:Data='AAAA'/>");
  const std::string name = md5Hex(extension);
  std::string part = "http://ns.adobe.com/xmp/extension/\0"s + name + "\0\0"s;
  part += {static_cast<char>(extension.size() >> 8), static_cast<char>(extension.size())};
  part += "\0\0\0\0"s + extension;
  return jpegWith(
      photoLikePicture(64, 128, 1),
      {{0xE1, cameraExif({.orientation = orientation, .width = 64, .height = 128})},
       xmpSegment(description("my:Thing='stays' GDepth:Near='0.3' GFocus:FocalPointX='0.7' "
                              "xmpNote:HasExtendedXMP='" +
                              name + "'/>")),
       {0xE1, bytesOf(part)}});
}

TEST(KeptMetadata, HasADepthMapAsLongAsNoPixelMoves) {
  const Written kept = rewritten(depthPhoto(1));
  EXPECT_TRUE(kept.lost.empty());
  for (const char* claim :
       {"GDepth:Near='0.3'", "GFocus:FocalPointX='0.7'", "GDepth:Data='AAAA'", "HasExtendedXMP='"})
    EXPECT_THAT(kept.text(), testing::HasSubstr(claim));

  for (const bool turned : {false, true}) {
    const Written moved = rewritten(depthPhoto(turned ? 6 : 1), {.scale = turned ? 1 : 2});
    EXPECT_EQ(moved.lost, (std::vector<Loss>{{"depth map", "describes the picture as it was"}}));
    for (const char* claim : {"GDepth:", "GFocus:", "HasExtendedXMP=", "/xmp/extension/"})
      EXPECT_THAT(moved.text(), testing::Not(testing::HasSubstr(claim)));
    EXPECT_THAT(moved.text(), testing::HasSubstr("my:Thing=\"stays\""));
  }
}

TEST(KeptMetadata, HasNoPicturesWithinXmpAndNoDepthOfThoseBehindThePicture) {
  const Written written = rewritten(jpegWith(
      photoLikePicture(64, 128, 1),
      {xmpSegment(xmpPacket(
          "<rdf:Description xmlns:GImage='http://ns.google.com/photos/1.0/image/' "
          "xmlns:Device='http://ns.google.com/photos/dd/1.0/device/' GImage:Data='AAAA'>"
          "<Device:Cameras><rdf:Seq><rdf:li/></rdf:Seq></Device:Cameras></rdf:Description>"))}));
  EXPECT_THAT(written.lost,
              testing::UnorderedElementsAre(Loss{"second picture", "shows the picture as it was"},
                                            Loss{"depth map", "describes the picture as it was"}));
  EXPECT_THAT(written.text(), testing::Not(testing::HasSubstr("GImage:Data")));
  EXPECT_THAT(written.text(), testing::Not(testing::HasSubstr("Device:Cameras")));
}

TEST(KeptMetadata, HasNoClaimOfPhonesToDepthThatWent) {
  const Written written = rewritten(jpegWith(
      photoLikePicture(64, 128, 1),
      {xmpSegment(xmpPacket("<rdf:Description "
                            "xmlns:blur='http://ns.apple.com/depthBlurEffect/1.0/' "
                            "xmlns:Mi='http://ns.xiaomi.com/photos/1.0/camera/' "
                            "blur:SimulatedAperture='4.5' Mi:XMPMeta='&lt;depthmap offset=\"9\"/>' "
                            "Mi:Model='stays'/>"))}));
  EXPECT_THAT(written.lost,
              testing::ElementsAre(Loss{"depth map", "describes the picture as it was"}));
  EXPECT_THAT(written.text(), testing::Not(testing::HasSubstr("SimulatedAperture")));
  EXPECT_THAT(written.text(), testing::Not(testing::HasSubstr("XMPMeta")));
  EXPECT_THAT(written.text(), testing::HasSubstr("stays"));
}

TEST(KeptMetadata, OfEveryKindAgreesAboutSizeAndOrientation) {
  const std::string xmp = xmpPacket(
      "<rdf:Description tiff:Orientation='6' exif:PixelXDimension='64' exif:PixelYDimension='128'>"
      "<mwg-rs:Regions rdf:parseType='Resource'><mwg-rs:AppliedToDimensions stDim:w='64' "
      "stDim:h='128'/><mwg-rs:RegionList><rdf:Bag><rdf:li mwg-rs:Type='Face'><mwg-rs:Area "
      "stArea:x='0.25' stArea:y='0.5' stArea:w='0.1' stArea:h='0.1'/></rdf:li></rdf:Bag>"
      "</mwg-rs:RegionList></mwg-rs:Regions></rdf:Description>");
  const Bytes file = jpegWith(photoLikePicture(64, 128, 1),
                              {{0xE1, cameraExif({.width = 64, .height = 128})}, xmpSegment(xmp)});
  const Written written = rewritten(file, {.scale = 2});
  const JpegHeader header = written.header();
  EXPECT_EQ(header.width, 64u);
  EXPECT_EQ(header.height, 32u);
  EXPECT_EQ(header.metadata[0].payload, cameraExif({.orientation = 1, .width = 64, .height = 32}));
  std::vector<MetadataSegment> segments = header.metadata;
  std::vector<Loss> lost;
  editXmp(
      segments,
      [](XmpPacket& packet) {
        EXPECT_EQ(packet.property({"http://ns.adobe.com/tiff/1.0/", "Orientation"}).text(), "1");
        EXPECT_EQ(packet.property({"http://ns.adobe.com/exif/1.0/", "PixelXDimension"}).text(),
                  "64");
        EXPECT_EQ(packet.property({"http://ns.adobe.com/exif/1.0/", "PixelYDimension"}).text(),
                  "32");
        const std::vector<KnownFace> faces = facesOf(packet, {{64, 32}, {64, 32}, {}, 1});
        ASSERT_EQ(faces.size(), 1u);
        EXPECT_NEAR((faces[0].left + faces[0].right) / 2, 0.5, 1e-6);
        EXPECT_NEAR((faces[0].top + faces[0].bottom) / 2, 0.25, 1e-6);
      },
      lost);
}

TEST(KeptMetadata, IsNamedAsLostWhereTheFormatHasNoPlaceForIt) {
  const Photo photo = open(phonePhoto(6, gainMap()));
  std::vector<Loss> lost;
  save(*photo.image, "PNG", photo.metadata, {}, &lost);
  EXPECT_EQ(
      std::count_if(lost.begin(), lost.end(),
                    [](const Loss& loss) { return loss.what == nameOf(TailPart::Kind::gainMap); }),
      1);
}

TEST(KeptMetadata, CanBeTheColourProfileAlone) {
  const MetadataSegment profile = {0xE2, bytesOf("ICC_PROFILE\0\1\1profile"s)};
  const Bytes file = joined({jpegWith(photoLikePicture(32, 32, 1),
                                      {{0xE1, cameraExif({})}, profile, {0xFE, bytesOf("note")}}),
                             gainMap()});
  const Written written = rewritten(file, {}, {.only = std::set<MetadataKind>()});
  EXPECT_TRUE(written.tail().empty());
  const std::vector<MetadataSegment> segments = written.header().metadata;
  ASSERT_EQ(segments.size(), 2u);  // JFIF and the profile
  EXPECT_EQ(segments[1].payload, profile.payload);
  EXPECT_TRUE(written.lost.empty());
}

TEST(KeptMetadata, SurvivesATailCutAnywhere) {
  const Bytes tail = joined({gainMap(), video(), bytesOf("CANON OPTIONAL DATA\0"s)});
  const Bytes photo = phonePhoto(6, {});
  for (std::size_t size = 0; size <= tail.size(); size += 1 + size / 64) {
    Bytes file = photo;
    file.insert(file.end(), tail.begin(), tail.begin() + static_cast<std::ptrdiff_t>(size));
    const Written written = rewritten(file);
    EXPECT_EQ(decodeJpeg(written.file).width, 128u);
  }
}

}  // namespace
}  // namespace pelorin::photo
