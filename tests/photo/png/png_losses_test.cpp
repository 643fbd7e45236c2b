#include "photo/png/png_losses.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <zlib.h>

#include "photo/metadata/segments.h"
#include "photo/metadata/xmp_packet.h"
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
using test_support::jpegWith;
using test_support::photoLikePicture;
using test_support::xmpPacket;
using test_support::xmpSegment;
using testing::HasSubstr;

constexpr XmpName large = {"urn:something:unknown", "Large"}, small = {large.space, "Small"};

std::vector<std::string> namesOf(const std::vector<Loss>& lost) {
  std::vector<std::string> names;
  for (const Loss& loss : lost) names.push_back(loss.what);
  return names;
}

// A packet, in segments, of which most is in an extension.
std::vector<MetadataSegment> extendedXmp() {
  std::vector<MetadataSegment> segments = {
      xmpSegment(xmpPacket("<rdf:Description my:Small='1'/>"))};
  std::vector<Loss> lost;
  editXmp(
      segments, [](XmpPacket& packet) { packet.add(large, "my", std::string(150'000, 'x')); },
      lost);
  EXPECT_EQ(segments.size(), 4u);
  EXPECT_TRUE(lost.empty());
  return segments;
}

TEST(PngLosses, OfExtendedXmpAreNone) {
  const Bytes jpeg = jpegWith(photoLikePicture(16, 16, 1), extendedXmp());
  const Photo photo = open(jpeg);
  std::vector<Loss> lost;
  const Bytes png = save(*photo.image, "PNG", photo.metadata, {}, &lost);
  EXPECT_TRUE(lost.empty());
  const Photo again = open(png);
  const XmpPacket packet([&] {
    const auto bytes = contentOf(again.metadata.segments, 0xE1, xmpMark);
    return std::string(bytes.begin(), bytes.end());
  }());
  EXPECT_EQ(packet.property(large).text().size(), 150'000u);
  EXPECT_EQ(packet.property(small).text(), "1");
  EXPECT_FALSE(packet.property({"http://ns.adobe.com/xmp/note/", "HasExtendedXMP"}));
  // And back into segments of a JPEG file.
  const Bytes back = save(*again.image, "JPEG", again.metadata, {}, &lost);
  EXPECT_TRUE(lost.empty());
  std::vector<MetadataSegment> segments = open(back).metadata.segments;
  std::size_t found = 0;
  editXmp(
      segments, [&](const XmpPacket& each) { found += each.property(large).text().size(); }, lost);
  EXPECT_EQ(found, 150'000u);
  EXPECT_TRUE(lost.empty());
}

TEST(PngLosses, AreNamedOneByOne) {
  KeptMetadata kept;
  kept.segments = {{0xE0, bytesOf("JFIF\0\1\2\1\0\x48\0\x48\0\0"s)},
                   {0xE1, test_support::cameraExif({})},
                   {0xE1, test_support::cameraExif({})},
                   xmpSegment(xmpPacket("<rdf:Description my:Small='1'/>")),
                   xmpSegment(xmpPacket("")),
                   {0xE2, bytesOf("ICC_PROFILE\0\1\2profile"s)},
                   {0xE2, bytesOf("FPXR"s)},
                   {0xED, bytesOf("Photoshop 3.0\0"s)},
                   {0xE5, bytesOf("maker"s)},
                   {0xE5, bytesOf("maker"s)},
                   {0xFE, bytesOf("note"s)}};
  kept.tail = {{TailPart::Kind::canonVrd, {}}};
  removeWhatPngLacks(kept);
  EXPECT_THAT(namesOf(kept.lost),
              testing::ElementsAre("Canon VRD trailer", "second EXIF", "second packet of XMP",
                                   "colour profile", "APP2 segment",
                                   "IPTC or another resource of Photoshop's", "APP5 segment"));
  ASSERT_EQ(kept.segments.size(), 3u);
  EXPECT_EQ(kept.segments[2].marker, 0xFE);
  ASSERT_EQ(kept.chunks.size(), 1u);
  EXPECT_EQ(kept.chunks[0].type, "pHYs");
  EXPECT_EQ(kept.chunks[0].data, bytesOf("\0\0\x0B\x13\0\0\x0B\x13\1"s));  // 72 an inch
}

TEST(PngLosses, LeaveNoClaimToThem) {
  const Photo photo = open(test_support::phonePhoto(
      1, test_support::joined({test_support::gainMap(), test_support::video()})));
  std::vector<Loss> lost;
  const Bytes png = save(*photo.image, "PNG", photo.metadata, {}, &lost);
  EXPECT_THAT(namesOf(lost), testing::ElementsAre("gain map", "motion photo video"));
  const std::string text(png.begin(), png.end());
  for (const char* claim : {"hdrgm:Version", "GainMap", "MotionPhoto", "Container:Directory"})
    EXPECT_THAT(text, testing::Not(HasSubstr(claim)));
}

Bytes withChunk(const Bytes& png, const std::string& type, const std::string& data) {
  const auto big = [](std::size_t value) {
    std::string bytes;
    for (int shift = 24; shift >= 0; shift -= 8) bytes += static_cast<char>(value >> shift & 255);
    return bytes;
  };
  const std::string body = type + data;
  const Bytes chunk = bytesOf(
      big(data.size()) + body +
      big(crc32(0, reinterpret_cast<const Bytef*>(body.data()), static_cast<uInt>(body.size()))));
  Bytes file = png;
  file.insert(file.begin() + 33, chunk.begin(), chunk.end());  // behind the header
  return file;
}

std::string packed(const std::string& text) {
  std::string bytes(compressBound(text.size()), '\0');
  uLongf size = bytes.size();
  compress(reinterpret_cast<Bytef*>(bytes.data()), &size,
           reinterpret_cast<const Bytef*>(text.data()), text.size());
  bytes.resize(size);
  return bytes;
}

TEST(PngMetadata, IncludesXmpThatIsPackedOrInALanguage) {
  const Bytes png = save(photoLikePicture(16, 16, 1), "PNG");
  const std::string xmp = xmpPacket("<rdf:Description my:Small='1'/>");
  const std::string keyword = "XML:com.adobe.xmp\0"s;
  for (const std::string& data : {"\0\0\0\0"s + xmp, "\0\0en\0XMP\0"s + xmp,
                                  "\1\0\0\0"s + packed(xmp), "\1\0en\0XMP\0"s + packed(xmp)}) {
    const Photo photo = open(withChunk(png, "iTXt", keyword + data));
    const auto found = contentOf(photo.metadata.segments, 0xE1, xmpMark);
    EXPECT_EQ(std::string(found.begin(), found.end()), xmp);
    EXPECT_TRUE(photo.metadata.chunks.empty());
  }
  EXPECT_THROW(open(withChunk(png, "iTXt", keyword + "\1\0\0\0"s + packed(xmp).substr(0, 50))),
               PhotoError);
}

TEST(PngMetadata, UnpacksToSixteenMegabytesAndNoByteMore) {
  const Bytes png = save(photoLikePicture(16, 16, 1), "PNG");
  constexpr std::size_t most = std::size_t{16} << 20;
  for (const std::size_t size : {most, most + 1}) {
    const Bytes file = withChunk(
        png, "iTXt", "XML:com.adobe.xmp\0"s + "\1\0\0\0"s + packed(std::string(size, ' ')));
    if (size == most) {
      EXPECT_EQ(contentOf(open(file).metadata.segments, 0xE1, xmpMark).size(), most);
    } else {
      EXPECT_THROW(open(file), PhotoError);
    }
  }
}

}  // namespace
}  // namespace pelorin::photo
