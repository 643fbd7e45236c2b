#include "photo/metadata/edit_mark.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "photo/metadata/xmp_packet.h"
#include "photo/metadata/xmp_segments.h"
#include "photo/photo.h"
#include "tests/photo/metadata/phone_photos.h"
#include "tests/photo/metadata/xmp_texts.h"
#include "tests/support/pictures.h"

namespace pelorin::photo {
namespace {

using test_support::Bytes;
using test_support::jpegWith;
using test_support::photoLikePicture;
using test_support::xmpPacket;
using test_support::xmpSegment;
using testing::ElementsAre;
using testing::IsEmpty;

const EditMark auto04 = {"1.2", "AE0", "slider=0.4;", "2024-05-01T12:30:45Z"};
const EditMark sepia = {"1.3", "Sepia", ""};
constexpr XmpName history = {"http://ns.adobe.com/xap/1.0/mm/", "History"};
constexpr std::string_view eventFields = "http://ns.adobe.com/xap/1.0/sType/ResourceEvent#";

// Of another program, with prefixes of its own.
const std::string othersHistory =
    "<rdf:Description xmlns:m='http://ns.adobe.com/xap/1.0/mm/' "
    "xmlns:e='http://ns.adobe.com/xap/1.0/sType/ResourceEvent#'><m:History><rdf:Seq><rdf:li "
    "e:action='saved' e:softwareAgent='A darkroom 3'/></rdf:Seq></m:History></rdf:Description>";

Bytes saved(const Bytes& file, std::string_view format, const std::optional<EditMark>& mark) {
  const Photo photo = open(file);
  std::vector<Loss> lost;
  const Bytes result = save(*photo.image, format, photo.metadata, {.mark = mark}, &lost);
  EXPECT_TRUE(lost.empty());
  return result;
}

TEST(EditMark, IsReadBackFromEveryFormat) {
  for (const std::string_view format : {"JPEG", "PNG"}) {
    const Bytes plain = jpegWith(photoLikePicture(16, 16, 1));
    EXPECT_THAT(readFacts(plain).edits, IsEmpty());
    EXPECT_THAT(readFacts(saved(plain, format, {})).edits, IsEmpty());
    const Bytes once = saved(plain, format, auto04);
    EXPECT_THAT(readFacts(once).edits, ElementsAre(auto04));
    const Bytes again = saved(once, format, sepia);
    EXPECT_THAT(readFacts(again).edits, ElementsAre(auto04, sepia));
    EXPECT_EQ(readFacts(saved(again, format, {})).edits.size(), 2u) << "kept like the rest";
  }
}

TEST(EditMark, ReadsAsASentenceForUsers) {
  EXPECT_EQ(textOf({"1.2", "AE0", "slider=0.4;"}), "AE0, slider 0.4");
  EXPECT_EQ(textOf({"1.2", "AE0", "slider=0.4;gtmOnly=true"}), "AE0, slider 0.4, gtmOnly true");
  EXPECT_EQ(textOf(sepia), "Sepia");
  EXPECT_EQ(textOf({"", "", ";;="}), ",  ");
}

TEST(EditMark, StandsBehindTheEventsOfOthers) {
  std::vector<MetadataSegment> segments = {xmpSegment(xmpPacket(othersHistory))};
  EXPECT_THAT(editMarksOf(segments), IsEmpty());
  std::vector<Loss> lost;
  addEditMark(segments, auto04, lost);
  ASSERT_EQ(segments.size(), 1u);
  EXPECT_THAT(editMarksOf(segments), ElementsAre(auto04));
  editXmp(
      segments,
      [](const XmpPacket& packet) {
        ASSERT_EQ(packet.properties(history).size(), 1u);
        const std::vector<XmpProperty> events = packet.property(history).items();
        ASSERT_EQ(events.size(), 2u);
        EXPECT_EQ(events[0].field({eventFields, "softwareAgent"}).text(), "A darkroom 3");
        EXPECT_EQ(events[1].field({eventFields, "action"}).text(), "edited");
        EXPECT_EQ(events[1].field({eventFields, "softwareAgent"}).text(), "Quenby 1.2");
      },
      lost);
  EXPECT_TRUE(lost.empty());
}

TEST(EditMark, IsAddedWhereTheHistoryIsInTheExtension) {
  // Events enough to be what moves there.
  std::string events;
  while (events.size() < 70'000) events += "<rdf:li e:softwareAgent='A darkroom 3'/>";
  const std::string moved =
      "<rdf:Description xmlns:m='http://ns.adobe.com/xap/1.0/mm/' "
      "xmlns:e='http://ns.adobe.com/xap/1.0/sType/ResourceEvent#'>"
      "<m:History><rdf:Seq>" +
      events + "</rdf:Seq></m:History></rdf:Description>";
  std::vector<MetadataSegment> segments = {xmpSegment(xmpPacket(moved))};
  std::vector<Loss> lost;
  editXmp(
      segments,
      [](XmpPacket& packet) {
        packet.add({"urn:something:unknown", "Change"}, "my", "1");
      },
      lost);
  ASSERT_GE(segments.size(), 3u);
  addEditMark(segments, auto04, lost);
  EXPECT_THAT(editMarksOf(segments), ElementsAre(auto04));
  int histories = 0;
  editXmp(
      segments,
      [&](const XmpPacket& packet) {
        histories += static_cast<int>(packet.properties(history).size());
      },
      lost);
  EXPECT_EQ(histories, 1);
  EXPECT_TRUE(lost.empty());
}

TEST(EditMark, InANewPacketComesBehindExif) {
  std::vector<MetadataSegment> segments = {
      {0xE1, test_support::cameraExif({})},
      {0xE2, test_support::bytesOf("ICC_PROFILE")},
  };
  std::vector<Loss> lost;
  addEditMark(segments, {"1.2", "Mine", "\"a\" < & > 'b'"}, lost);
  ASSERT_EQ(segments.size(), 3u);
  EXPECT_EQ(segments[1].marker, 0xE1);
  EXPECT_EQ(editMarksOf(segments).at(0).params, "\"a\" < & > 'b'");
}

TEST(EditMark, IsNoneWhereAHistoryIsNoListOrNotOurs) {
  for (const std::string text :
       {"<rdf:Description xmlns:m='http://ns.adobe.com/xap/1.0/mm/' m:History='Quenby 1.2'/>",
        "<rdf:Description my:Thing='Quenby 1.2'/>", "<rdf:Description Quenby "}) {
    std::vector<MetadataSegment> segments = {xmpSegment(xmpPacket(text))};
    EXPECT_THAT(editMarksOf(segments), IsEmpty()) << text;
    std::vector<Loss> lost;
    addEditMark(segments, auto04, lost);
    EXPECT_THAT(editMarksOf(segments), ElementsAre(auto04)) << text;
  }
}

}  // namespace
}  // namespace pelorin::photo
