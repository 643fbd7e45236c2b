#include "photo/metadata/xmp_facts.h"

#include <gtest/gtest.h>

#include "tests/photo/metadata/xmp_texts.h"

namespace pelorin::photo {
namespace {

using test_support::xmpPacket;

const PictureChange change = {{400, 300}, {150, 200}, {false, 1}, 6};

TEST(XmpFacts, StateTheUprightPictureAndItsSize) {
  for (const std::string text :
       {"<rdf:Description tiff:Orientation='6' tiff:ImageWidth='400' tiff:ImageLength='300' "
        "exif:PixelXDimension='400' exif:PixelYDimension='300'/>",
        "<rdf:Description><tiff:Orientation>6</tiff:Orientation><tiff:ImageWidth>400"
        "</tiff:ImageWidth><tiff:ImageLength>300</tiff:ImageLength><exif:PixelXDimension>400"
        "</exif:PixelXDimension><exif:PixelYDimension>300</exif:PixelYDimension>"
        "</rdf:Description>"}) {
    XmpPacket packet(xmpPacket(text));
    std::vector<Loss> lost;
    stateFacts(packet, change, lost);
    const XmpPacket written(packet.bytes());
    constexpr std::string_view tiff = "http://ns.adobe.com/tiff/1.0/";
    constexpr std::string_view exif = "http://ns.adobe.com/exif/1.0/";
    EXPECT_EQ(written.property({tiff, "Orientation"}).text(), "1");
    EXPECT_EQ(written.property({tiff, "ImageWidth"}).text(), "150");
    EXPECT_EQ(written.property({tiff, "ImageLength"}).text(), "200");
    EXPECT_EQ(written.property({exif, "PixelXDimension"}).text(), "150");
    EXPECT_EQ(written.property({exif, "PixelYDimension"}).text(), "200");
    EXPECT_TRUE(lost.empty());
  }
}

TEST(XmpFacts, AreNotAddedToAPacketThatStatesNone) {
  const std::string bytes = xmpPacket("<rdf:Description my:Thing='1'/>");
  XmpPacket packet(bytes);
  std::vector<Loss> lost;
  stateFacts(packet, change, lost);
  EXPECT_EQ(packet.bytes(), bytes);
}

TEST(XmpFacts, NameTheThumbnailThatGoes) {
  XmpPacket packet(
      xmpPacket("<rdf:Description><xmp:Thumbnails><rdf:Alt><rdf:li/></rdf:Alt>"
                "</xmp:Thumbnails></rdf:Description>"));
  std::vector<Loss> lost;
  stateFacts(packet, change, lost);
  EXPECT_EQ(lost, (std::vector<Loss>{{"XMP thumbnail", "shows the picture as it was"}}));
  EXPECT_EQ(packet.bytes().find("<xmp:Thumbnails"), std::string::npos);
}

}  // namespace
}  // namespace pelorin::photo
