#include "photo/metadata/chosen_metadata.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <span>

#include "photo/metadata/capture_time.h"
#include "photo/metadata/segments.h"
#include "photo/metadata/tiff.h"
#include "photo/metadata/xmp_packet.h"
#include "tests/photo/metadata/phone_photos.h"
#include "tests/photo/metadata/xmp_texts.h"

namespace pelorin::photo {
namespace {

using namespace std::string_literals;
using test_support::Bytes;
using test_support::bytesOf;
using test_support::xmpPacket;
using test_support::xmpSegment;
using Kinds = std::set<MetadataKind>;

// Little-endian: Make, Artist, the Exif directory and Copyright; there the version, the time it was
// taken and a maker note.
Bytes exif() {
  return bytesOf(
      "Exif\0\0II*\0\x08\0\0\0"
      "\x04\0\x0F\x01\x02\0\x03\0\0\0Us\0\0\x3B\x01\x02\0\x04\0\0\0Ada\0"
      "\x69\x87\x04\0\x01\0\0\0\x3E\0\0\0\x98\x82\x02\0\x08\0\0\0\x68\0\0\0\0\0\0\0"
      "\x03\0\0\x90\x07\0\x04\0\0\0"
      "0232\x03\x90\x02\0\x14\0\0\0\x70\0\0\0\x7C\x92\x07\0\x04\0\0\0mkr!\0\0\0\0"
      "(c) Ada\0"
      "2024:05:01 12:30:45\0"s);
}

const MetadataSegment iptc = {
    0xED,
    bytesOf("Photoshop 3.0\0"s + "8BIM\x04\x04\0\0\0\0\0\x21"s +
            "\x1C\x01\x5A\0\3\x1B%G\x1C\x02\x50\0\3Ada\x1C\x02\x5A\0\4Town\x1C\x02\x37\0\x03"s +
            "may"s + "8BIM\x04\x25\0\0\0\0\0\2xx"s)};

const std::string xmp =
    "<rdf:Description xmlns:dc='http://purl.org/dc/elements/1.1/' "
    "xmlns:xmpRights='http://ns.adobe.com/xap/1.0/rights/' "
    "xmlns:hdrgm='http://ns.adobe.com/hdr-gain-map/1.0/' hdrgm:Version='1.0' "
    "xmpRights:Marked='True' exif:DateTimeOriginal='2024' my:Thing='secret'>"
    "<dc:rights><rdf:Alt><rdf:li xml:lang='x-default'>(c) Ada</rdf:li></rdf:Alt></dc:rights>"
    "<dc:title>secret</dc:title></rdf:Description>";

Metadata everything() {
  return {.segments = {{0xE1, exif()},
                       xmpSegment(xmpPacket(xmp)),
                       {0xE2, bytesOf("ICC_PROFILE\0\1\1profile"s)},
                       {0xE2, bytesOf("urn:iso:std:iso:ts:21496:-1\0\0\0\0\0"s)},
                       iptc,
                       {0xFE, bytesOf("secret")}},
          .chunks = {{"tEXt", bytesOf("Author\0Ada"s)},
                     {"tEXt", bytesOf("Creation Time\0may"s)},
                     {"tEXt", bytesOf("Comment\0secret"s)},
                     {"gAMA", {0, 0, 0, 1}}},
          .tail = test_support::joined({test_support::gainMap(), test_support::video()})};
}

std::string allOf(const Metadata& metadata) {
  std::string text;
  for (const MetadataSegment& s : metadata.segments)
    text.append(s.payload.begin(), s.payload.end());
  for (const PngChunk& c : metadata.chunks) text.append(c.data.begin(), c.data.end());
  return text;
}

TEST(ChosenMetadata, OfNothingIsTheColours) {
  const Metadata chosen = chosenMetadata(everything(), {});
  ASSERT_EQ(chosen.segments.size(), 1u);
  EXPECT_TRUE(isColourProfile(chosen.segments[0]));
  ASSERT_EQ(chosen.chunks.size(), 1u);
  EXPECT_EQ(chosen.chunks[0].type, "gAMA");
  EXPECT_TRUE(chosen.tail.empty());
}

TEST(ChosenMetadata, OfAContainerIsAllOfIt) {
  const Metadata all = everything();
  const std::pair<MetadataKind, std::size_t> containers[] = {
      {MetadataKind::exif, 0}, {MetadataKind::xmp, 1}, {MetadataKind::iptc, 4}};
  for (const auto& [kind, place] : containers) {
    const Metadata chosen = chosenMetadata(all, {kind});
    ASSERT_EQ(chosen.segments.size(), 2u);
    EXPECT_EQ(chosen.segments[place < 2 ? 0 : 1], all.segments[place]);
  }
  const Metadata map = chosenMetadata(all, {MetadataKind::gainMap});
  EXPECT_EQ(map.tail, test_support::gainMap());
  ASSERT_EQ(map.segments.size(), 3u);
  EXPECT_EQ(map.segments[2], all.segments[3]);
  EXPECT_THAT(allOf(map), testing::HasSubstr("hdrgm:Version=\"1.0\""));
  EXPECT_THAT(allOf(map), testing::Not(testing::HasSubstr("secret")));
}

TEST(ChosenMetadata, OfCopyrightAndTimeIsWhatTellsThem) {
  const std::string copyright = allOf(chosenMetadata(everything(), {MetadataKind::copyright}));
  for (const char* kept : {"(c) Ada\0", "Author", "\x1C\x02\x50", "\x1B%G", "xmpRights:Marked"})
    EXPECT_THAT(copyright, testing::HasSubstr(kept));
  for (const char* gone : {"secret", "2024", "Us", "Town", "may", "mkr!", "hdrgm:Version="})
    EXPECT_THAT(copyright, testing::Not(testing::HasSubstr(gone)));

  const Metadata time = chosenMetadata(everything(), {MetadataKind::time});
  EXPECT_EQ(exifCaptureTime(time.segments[0].payload)->text, exifCaptureTime(exif())->text);
  for (const char* gone : {"Ada", "secret", "Town", "mkr!"})
    EXPECT_THAT(allOf(time), testing::Not(testing::HasSubstr(gone)));
  EXPECT_THAT(allOf(time), testing::HasSubstr("may"));
}

TEST(ChosenMetadata, AsAnExcerptOfExifHasItsTextsInOrder) {
  const Metadata chosen =
      chosenMetadata(everything(), {MetadataKind::copyright, MetadataKind::time});
  const Bytes& payload = chosen.segments[0].payload;
  const Tiff tiff(std::span<const std::uint8_t>(payload).subspan(6));
  const TiffDirectory first = tiff.firstDirectory();
  ASSERT_EQ(first.entries.size(), 3u);
  EXPECT_EQ(first.entries[0].tag, 0x013B);
  EXPECT_EQ(first.entries[1].tag, 0x8298);
  const TiffDirectory second = tiff.directoryOf(first.find(0x8769));
  ASSERT_EQ(second.entries.size(), 2u);
  EXPECT_EQ(second.entries[0].tag, 0x9000);
  EXPECT_EQ(second.entries[1].tag, 0x9003);
}

TEST(ChosenMetadata, OfADirectoryThatRepeatsATagIsTheFirst) {
  constexpr std::uint8_t entries = 200;
  std::string payload = "Exif\0\0II*\0\x08\0\0\0"s + static_cast<char>(entries) + "\0"s;
  // Each is the copyright, of all the bytes from the file's first.
  for (int i = 0; i < entries; ++i) payload += "\x98\x82\2\0\x60\x09\0\0\0\0\0\0"s;
  payload += "\0\0\0\0"s;
  const Metadata all = {.segments = {{0xE1, bytesOf(payload)}}};
  const Metadata chosen = chosenMetadata(all, {MetadataKind::copyright});
  ASSERT_EQ(chosen.segments.size(), 1u);
  EXPECT_LT(chosen.segments[0].payload.size(), payload.size() + 30);
}

TEST(ChosenMetadata, OfWhatIsCutAnywhereIsChosenOrNothing) {
  const Kinds kinds = {MetadataKind::copyright, MetadataKind::time};
  for (std::size_t place : {0, 1, 4}) {
    const Metadata all = everything();
    for (std::size_t size = 0; size <= all.segments[place].payload.size(); ++size) {
      Metadata cut = {.segments = {all.segments[place]}};
      cut.segments[0].payload.resize(size);
      const Metadata chosen = chosenMetadata(cut, kinds);
      EXPECT_LE(chosen.segments.size(), 1u);
    }
  }
}

}  // namespace
}  // namespace pelorin::photo
