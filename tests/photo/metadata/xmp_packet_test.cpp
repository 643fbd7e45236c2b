#include "photo/metadata/xmp_packet.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "tests/photo/metadata/xmp_texts.h"

namespace pelorin::photo {
namespace {

using test_support::xmpPacket;
using testing::HasSubstr;
using testing::Not;

constexpr XmpName orientation = {"http://ns.adobe.com/tiff/1.0/", "Orientation"};
constexpr XmpName mine = {"urn:something:unknown", "Thing"};

TEST(XmpPacket, IsReadInBothSpellings) {
  const XmpPacket attribute(xmpPacket("<rdf:Description rdf:about='' tiff:Orientation='6'/>"));
  EXPECT_EQ(attribute.property(orientation).text(), "6");
  const XmpPacket element(xmpPacket(
      "<rdf:Description rdf:about=''><tiff:Orientation> 6\n</tiff:Orientation></rdf:Description>"));
  EXPECT_EQ(element.property(orientation).text(), "6");
  const XmpPacket qualified(
      xmpPacket("<rdf:Description rdf:about=''><tiff:Orientation rdf:parseType='Resource'>"
                "<rdf:value>6</rdf:value><my:Note>x</my:Note></tiff:Orientation>"
                "</rdf:Description>"));
  EXPECT_EQ(qualified.property(orientation).text(), "6");
}

TEST(XmpPacket, KnowsNamesByTheirNamespacesAndNotTheirPrefixes) {
  const XmpPacket other(
      xmpPacket("<rdf:Description xmlns:t='http://ns.adobe.com/tiff/1.0/' t:Orientation='8'/>"));
  EXPECT_EQ(other.property(orientation).text(), "8");
  const XmpPacket shadowed(
      xmpPacket("<rdf:Description xmlns:tiff='urn:else' tiff:Orientation='8'/>"));
  EXPECT_FALSE(shadowed.property(orientation));
}

TEST(XmpPacket, FindsFieldsInEverySpellingOfAStructure) {
  for (const std::string text :
       {"<my:Thing my:Field='5'/>",
        "<my:Thing rdf:parseType='Resource'><my:Field>5</my:Field></my:Thing>",
        "<my:Thing><rdf:Description my:Field='5'/></my:Thing>",
        "<my:Thing><rdf:Description><my:Field>5</my:Field></rdf:Description></my:Thing>"}) {
    const XmpPacket packet(xmpPacket("<rdf:Description>" + text + "</rdf:Description>"));
    EXPECT_EQ(packet.property(mine).field({mine.space, "Field"}).text(), "5") << text;
  }
}

TEST(XmpPacket, WithoutAChangeKeepsItsBytes) {
  const std::string bytes = xmpPacket(
      "<rdf:Description tiff:Orientation = '1' my:Quote=\"&#39;\"></rdf:Description>", 100);
  XmpPacket packet(bytes);
  packet.property(orientation).setText("1");
  EXPECT_FALSE(packet.changed());
  EXPECT_EQ(packet.bytes(), bytes);
}

TEST(XmpPacket, KeepsWhatItDoesNotKnow) {
  const std::string unknown =
      "<my:Thing my:a=\"1 &lt; 2\">text &amp; <!-- a note --><?tool data?><my:Deep "
      "rdf:parseType=\"Resource\"/>\n  tail</my:Thing>";
  XmpPacket packet(
      xmpPacket("<rdf:Description tiff:Orientation='6'>" + unknown + "</rdf:Description>"));
  packet.property(orientation).setText("1");
  EXPECT_TRUE(packet.changed());
  const std::string bytes = packet.bytes();
  EXPECT_THAT(bytes, HasSubstr("text &amp; <!-- a note --><?tool data?>"));
  EXPECT_THAT(bytes, HasSubstr("\n  tail</my:Thing>"));
  EXPECT_THAT(bytes, HasSubstr("my:a=\"1 &lt; 2\""));
  EXPECT_THAT(bytes, HasSubstr("tiff:Orientation=\"1\""));
  EXPECT_THAT(bytes, HasSubstr("<?xpacket begin=\"\xEF\xBB\xBF\" id"));
  EXPECT_EQ(XmpPacket(bytes).bytes(), bytes);
}

TEST(XmpPacket, WritesIntoItsPadding) {
  const std::string before =
      xmpPacket("<rdf:Description><tiff:Orientation>6</tiff:Orientation></rdf:Description>", 200);
  for (const std::size_t length : {1, 50, 150}) {
    XmpPacket packet(before);
    packet.property(orientation).setText(std::string(length, '7'));
    EXPECT_EQ(packet.bytes().size(), before.size()) << length;
    EXPECT_THAT(packet.bytes(), testing::EndsWith("<?xpacket end=\"w\"?>"));
  }
  XmpPacket packet(before);
  packet.property(orientation).setText(std::string(5000, '7'));
  EXPECT_EQ(XmpPacket(packet.bytes()).property(orientation).text().size(), 5000u);
}

TEST(XmpPacket, RemovesAttributesAndElements) {
  XmpPacket packet(
      xmpPacket("<rdf:Description tiff:Orientation='6'><tiff:Orientation>3"
                "</tiff:Orientation><my:Thing>stays</my:Thing></rdf:Description>"));
  ASSERT_EQ(packet.properties(orientation).size(), 2u);
  for (XmpProperty& property : packet.properties(orientation)) property.remove();
  EXPECT_THAT(packet.bytes(), Not(HasSubstr("tiff:Orientation")));
  EXPECT_EQ(XmpPacket(packet.bytes()).property(mine).text(), "stays");
}

TEST(XmpPacket, TakesPropertiesOfAnotherWithTheirNamespaces) {
  XmpPacket from(
      xmpPacket("<rdf:Description xmlns:q='urn:q' q:A='1'><q:B><rdf:Bag><rdf:li q:C='2'/>"
                "</rdf:Bag></q:B></rdf:Description>"));
  XmpPacket to;
  to.take(from.property({"urn:q", "A"}));
  to.take(from.property({"urn:q", "B"}));
  EXPECT_FALSE(from.property({"urn:q", "A"}));
  EXPECT_FALSE(from.property({"urn:q", "B"}));
  const XmpPacket written(to.bytes());
  EXPECT_EQ(written.property({"urn:q", "A"}).text(), "1");
  const std::vector<XmpProperty> items = written.property({"urn:q", "B"}).items();
  ASSERT_EQ(items.size(), 1u);
  EXPECT_EQ(items[0].field({"urn:q", "C"}).text(), "2");
}

TEST(XmpPacket, RefusesDocumentTypesAndSoEntityBombs) {
  const std::string bomb =
      "<!DOCTYPE x [<!ENTITY a 'aaaaaaaaaa'><!ENTITY b '&a;&a;&a;&a;&a;&a;&a;&a;&a;&a;'>]>"
      "<x:xmpmeta xmlns:x='adobe:ns:meta/'><rdf:RDF "
      "xmlns:rdf='http://www.w3.org/1999/02/22-rdf-syntax-ns#'>&b;</rdf:RDF></x:xmpmeta>";
  EXPECT_THROW(XmpPacket{bomb}, XmpError);
}

TEST(XmpPacket, RefusesDepthAndNumbersThatOnlyServeToHurt) {
  std::string deep;
  for (int i = 0; i < 100'000; ++i) deep += "<my:Thing>";
  for (int i = 0; i < 100'000; ++i) deep += "</my:Thing>";
  EXPECT_THROW(XmpPacket(xmpPacket("<rdf:Description>" + deep + "</rdf:Description>")), XmpError);
  std::string many;
  for (int i = 0; i < 1'000'001; ++i) many += "<a/>";
  EXPECT_THROW(XmpPacket(xmpPacket(many)), XmpError);
}

TEST(XmpPacket, CutAnywhereIsReadOrRefused) {
  const std::string whole = xmpPacket(
      "<rdf:Description tiff:Orientation='6'><my:Thing>&amp;<![CDATA[x]]></my:Thing>"
      "</rdf:Description>",
      20);
  std::size_t refused = 0;
  for (std::size_t size = 0; size < whole.size(); ++size) {
    try {
      XmpPacket packet(std::string_view(whole).substr(0, size));
      EXPECT_EQ(packet.property(orientation).text(), "6");
    } catch (const XmpError&) {
      ++refused;
    }
  }
  EXPECT_GT(refused, whole.find("</x:xmpmeta>"));
  EXPECT_LT(refused, whole.size());
}

}  // namespace
}  // namespace pelorin::photo
