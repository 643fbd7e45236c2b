#include "photo/metadata/xmp_segments.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>

#include "photo/metadata/md5.h"
#include "tests/photo/metadata/xmp_texts.h"

namespace pelorin::photo {
namespace {

using namespace std::string_literals;
using test_support::xmpPacket;
using Segments = std::vector<MetadataSegment>;

constexpr XmpName orientationName = {"http://ns.adobe.com/tiff/1.0/", "Orientation"};
constexpr XmpName thing = {"urn:something:unknown", "Thing"};
const std::string packetMark = "http://ns.adobe.com/xap/1.0/\0"s;
const std::string extensionMark = "http://ns.adobe.com/xmp/extension/\0"s;

MetadataSegment app1(const std::string& payload) {
  return {0xE1, {payload.begin(), payload.end()}};
}

MetadataSegment packetSegment(const std::string& text) {
  return app1(packetMark + text);
}

std::string bigEndian(std::size_t value) {
  std::string bytes;
  for (int shift = 24; shift >= 0; shift -= 8) bytes += static_cast<char>(value >> shift);
  return bytes;
}

Segments extensionSegments(const std::string& text, std::size_t partSize) {
  Segments segments;
  for (std::size_t at = 0; at < text.size(); at += partSize) {
    segments.push_back(app1(extensionMark + md5Hex(text) + bigEndian(text.size()) + bigEndian(at) +
                            text.substr(at, partSize)));
  }
  return segments;
}

Segments withExtension(const std::string& extension, std::size_t partSize) {
  Segments segments = {
      packetSegment(xmpPacket("<rdf:Description tiff:Orientation='6' "
                              "xmpNote:HasExtendedXMP='" +
                              md5Hex(extension) + "'/>"))};
  for (MetadataSegment& segment : extensionSegments(extension, partSize))
    segments.push_back(std::move(segment));
  return segments;
}

void makeUpright(XmpPacket& packet) {
  for (XmpProperty& property : packet.properties(orientationName)) property.setText("1");
}

// The values of a property in the packets as another reader would find them.
std::vector<std::string> valuesIn(Segments segments, XmpName name) {
  std::vector<std::string> values;
  std::vector<Loss> lost;
  editXmp(
      segments,
      [&](XmpPacket& packet) {
        for (const XmpProperty& property : packet.properties(name))
          values.push_back(property.text());
      },
      lost);
  EXPECT_TRUE(lost.empty());
  return values;
}

TEST(XmpSegments, AreEditedInPlaceAmongOthers) {
  Segments segments = {app1("Exif\0\0..."s),
                       packetSegment(xmpPacket("<rdf:Description "
                                               "tiff:Orientation='6'/>")),
                       {0xFE, {'n', 'o', 't', 'e'}}};
  const Segments before = segments;
  std::vector<Loss> lost;
  editXmp(segments, makeUpright, lost);
  ASSERT_EQ(segments.size(), 3u);
  EXPECT_EQ(segments[0].payload, before[0].payload);
  EXPECT_EQ(segments[2].payload, before[2].payload);
  EXPECT_EQ(valuesIn(segments, orientationName), std::vector<std::string>{"1"});
  EXPECT_TRUE(lost.empty());
}

TEST(XmpSegments, CarryAnUntouchedExtensionUnderItsOwnName) {
  const std::string extension =
      xmpPacket("<rdf:Description my:Thing='" + std::string(1000, 'x') + "'/>");
  Segments segments = withExtension(extension, 100);
  std::vector<Loss> lost;
  editXmp(segments, makeUpright, lost);
  EXPECT_TRUE(lost.empty());
  EXPECT_EQ(valuesIn(segments, thing), std::vector<std::string>{std::string(1000, 'x')});
  const MetadataSegment& last = segments.back();
  EXPECT_EQ(std::string(last.payload.begin() + 35, last.payload.begin() + 67), md5Hex(extension));
}

TEST(XmpSegments, OfAnEditedExtensionTakeItsNewNameAndLength) {
  const std::string extension = xmpPacket("<rdf:Description tiff:Orientation='6' my:Thing='" +
                                          std::string(200'000, 'x') + "'/>");
  Segments segments = withExtension(extension, 65'000);
  std::vector<Loss> lost;
  editXmp(segments, makeUpright, lost);
  EXPECT_TRUE(lost.empty());
  EXPECT_EQ(valuesIn(segments, orientationName), (std::vector<std::string>{"1", "1"}));
  std::string joined;
  for (std::size_t i = 1; i < segments.size(); ++i) {
    const std::string payload(segments[i].payload.begin(), segments[i].payload.end());
    EXPECT_LE(payload.size(), 65'533u);
    EXPECT_EQ(payload.substr(71, 4), bigEndian(joined.size()));
    joined += payload.substr(75);
  }
  const std::string first(segments[1].payload.begin(), segments[1].payload.end());
  EXPECT_EQ(first.substr(35, 32), md5Hex(joined));
  EXPECT_EQ(first.substr(67, 4), bigEndian(joined.size()));
}

TEST(XmpSegments, ThatGrowMoveTheirLargestPropertyToAnExtension) {
  Segments segments = {packetSegment(xmpPacket("<rdf:Description tiff:Orientation='6' my:Thing='" +
                                               std::string(63'000, 'x') + "'/>"))};
  std::vector<Loss> lost;
  editXmp(
      segments,
      [](XmpPacket& packet) {
        if (packet.property(orientationName))
          packet.add({"urn:n", "Note"}, "n", std::string(4000, 'n'));
      },
      lost);
  EXPECT_TRUE(lost.empty());
  ASSERT_EQ(segments.size(), 2u);
  EXPECT_LE(segments[0].payload.size(), 65'533u);
  EXPECT_EQ(valuesIn(segments, thing), std::vector<std::string>{std::string(63'000, 'x')});
  EXPECT_EQ(valuesIn(segments, {"urn:n", "Note"}),
            std::vector<std::string>{std::string(4000, 'n')});
}

TEST(XmpSegments, ThatCannotBeReadGoAndAreNamed) {
  Segments segments = {packetSegment("<x:xmpmeta"), {0xFE, {'n'}}};
  std::vector<Loss> lost;
  editXmp(segments, makeUpright, lost);
  EXPECT_EQ(lost, (std::vector<Loss>{{"XMP", "not well-formed XML"}}));
  ASSERT_EQ(segments.size(), 1u);
  EXPECT_EQ(segments[0].marker, 0xFE);
}

TEST(XmpSegments, WithoutOneOfTheirPartsLoseTheExtensionAndSaySo) {
  const std::string extension = xmpPacket("<rdf:Description my:Thing='x'/>");
  const Segments whole = withExtension(extension, 50);
  for (std::size_t missing = 1; missing < whole.size(); ++missing) {
    Segments segments = whole;
    segments.erase(segments.begin() + static_cast<std::ptrdiff_t>(missing));
    std::vector<Loss> lost;
    editXmp(segments, makeUpright, lost);
    EXPECT_EQ(lost, (std::vector<Loss>{{"Extended XMP", "incomplete"}}));
    EXPECT_EQ(segments.size(), 1u);
    EXPECT_TRUE(valuesIn(segments, {"http://ns.adobe.com/xmp/note/", "HasExtendedXMP"}).empty());
  }
  Segments lonely = {whole.begin() + 1, whole.end()};
  std::vector<Loss> lost;
  editXmp(lonely, makeUpright, lost);
  EXPECT_EQ(lost.size(), 1u);
  EXPECT_TRUE(lonely.empty());
}

TEST(XmpSegments, SurviveAnExtensionThatIsCutOrLiesAboutItsSize) {
  const std::string extension = xmpPacket("<rdf:Description my:Thing='x'/>");
  const Segments whole = withExtension(extension, 100'000);
  for (std::size_t size = 0; size < whole[1].payload.size(); ++size) {
    Segments segments = whole;
    segments[1].payload.resize(size);
    std::vector<Loss> lost;
    editXmp(segments, makeUpright, lost);
    EXPECT_EQ(segments[0].marker, 0xE1);
    EXPECT_FALSE(size >= extensionMark.size() && lost.empty()) << size;
  }
  for (const std::size_t place : {67, 71}) {
    for (const std::uint8_t byte : {0x7F, 0xFF}) {
      Segments segments = whole;
      segments[1].payload[place] = byte;
      std::vector<Loss> lost;
      editXmp(segments, makeUpright, lost);
      EXPECT_EQ(lost.size(), 1u);
    }
  }
}

}  // namespace
}  // namespace pelorin::photo
