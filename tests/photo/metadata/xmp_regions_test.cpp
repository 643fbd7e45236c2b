#include "photo/metadata/xmp_regions.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <string>

#include "tests/photo/metadata/xmp_texts.h"
#include "tests/support/comma_locale.h"
#include "tests/support/comma_numbers.h"

namespace pelorin::photo {
namespace {

using test_support::xmpPacket;

constexpr std::string_view mwg = "http://www.metadataworkinggroup.com/schemas/regions/";
constexpr std::string_view areaSpace = "http://ns.adobe.com/xmp/sType/Area#";

constexpr PictureSize stored = {400, 300};

PictureChange upright(int orientation, int degrees = 0) {
  PictureChange change = {stored, stored, turnedFurther(uprightTurn(orientation), degrees),
                          orientation};
  if (change.turn.swapsAxes()) change.after = {300, 400};
  return change;
}

// A face in the stored picture at 0.5 ... 0.7 across and 0.2 ... 0.3 down.
std::string workingGroup(int width, int height,
                         const std::string& area =
                             "stArea:x='0.6' "
                             "stArea:y='0.25' "
                             "stArea:w='0.2' "
                             "stArea:h='0.1' "
                             "stArea:unit='normalized'",
                         const std::string& more = "") {
  return "<rdf:Description><mwg-rs:Regions rdf:parseType='Resource'><mwg-rs:AppliedToDimensions "
         "stDim:w='" +
         std::to_string(width) + "' stDim:h='" + std::to_string(height) +
         "' stDim:unit='pixel'/><mwg-rs:RegionList><rdf:Bag><rdf:li "
         "rdf:parseType='Resource'><mwg-rs:Type>Face</mwg-rs:Type><mwg-rs:Name>Ada</"
         "mwg-rs:Name><mwg-rs:Area " +
         area + "/>" + more +
         "</rdf:li></rdf:Bag></mwg-rs:RegionList></mwg-rs:Regions></rdf:Description>";
}

std::string microsoft(const std::string& rectangle) {
  return "<rdf:Description><MP:RegionInfo rdf:parseType='Resource'><MPRI:Regions><rdf:Bag><rdf:li "
         "MPReg:PersonDisplayName='Ada' MPReg:Rectangle='" +
         rectangle + "'/></rdf:Bag></MPRI:Regions></MP:RegionInfo></rdf:Description>";
}

// Shown where that face is; found a little beside it.
std::string acdsee(const std::string& assigned = "manual") {
  return "<rdf:Description><acdsee-rs:Regions rdf:parseType='Resource'>"
         "<acdsee-rs:AppliedToDimensions acdsee-stDim:w='400' acdsee-stDim:h='300' "
         "acdsee-stDim:unit='pixel'/><acdsee-rs:RegionList><rdf:Bag><rdf:li>"
         "<rdf:Description acdsee-rs:Type='Face' acdsee-rs:Name='Ada' acdsee-rs:NameAssignType='" +
         assigned +
         "'><acdsee-rs:DLYArea acdsee-stArea:x='0.6' acdsee-stArea:y='0.25' acdsee-stArea:w='0.2' "
         "acdsee-stArea:h='0.1'/><acdsee-rs:ALGArea acdsee-stArea:x='0.5' acdsee-stArea:y='0.25' "
         "acdsee-stArea:w='0.2' acdsee-stArea:h='0.2'/></rdf:Description></rdf:li></rdf:Bag>"
         "</acdsee-rs:RegionList></acdsee-rs:Regions></rdf:Description>";
}

void expectFace(const std::vector<KnownFace>& faces, double left, double top, double right,
                double bottom) {
  ASSERT_EQ(faces.size(), 1u);
  EXPECT_NEAR(faces[0].left, left, 1e-6);
  EXPECT_NEAR(faces[0].top, top, 1e-6);
  EXPECT_NEAR(faces[0].right, right, 1e-6);
  EXPECT_NEAR(faces[0].bottom, bottom, 1e-6);
  EXPECT_EQ(faces[0].name, "Ada");
}

// Where that face stands in the upright picture, from what the values of EXIF mean: where row 0 and
// column 0 of the stored picture are to be seen.
std::array<double, 4> uprightFace(int orientation) {
  switch (orientation) {
    case 1:
      return {0.5, 0.2, 0.7, 0.3};
    case 2:
      return {0.3, 0.2, 0.5, 0.3};  // row 0 top, column 0 right
    case 3:
      return {0.3, 0.7, 0.5, 0.8};  // bottom, right
    case 4:
      return {0.5, 0.7, 0.7, 0.8};  // bottom, left
    case 5:
      return {0.2, 0.5, 0.3, 0.7};  // left, top
    case 6:
      return {0.7, 0.5, 0.8, 0.7};  // right, top
    case 7:
      return {0.7, 0.3, 0.8, 0.5};  // right, bottom
    default:
      return {0.2, 0.3, 0.3, 0.5};  // left, bottom
  }
}

TEST(XmpRegions, StandWhereTheirContentsStandInAllOrientationsAndDialects) {
  for (int orientation = 1; orientation <= 8; ++orientation) {
    for (const std::string& text :
         {workingGroup(400, 300), microsoft("0.5, 0.2, 0.2, 0.1"), acdsee()}) {
      XmpPacket packet(xmpPacket(text));
      const PictureChange change = upright(orientation);
      const auto [left, top, right, bottom] = uprightFace(orientation);
      expectFace(facesOf(packet, change), left, top, right, bottom);
      turnRegions(packet, change);
      const XmpPacket written(packet.bytes());
      const PictureChange none = {change.after, change.after, {}, 1};
      expectFace(facesOf(written, none), left, top, right, bottom);
    }
  }
}

TEST(XmpRegions, AreTurnedFurtherWithThePicture) {
  XmpPacket packet(xmpPacket(workingGroup(400, 300)));
  const PictureChange change = upright(1, 90);
  turnRegions(packet, change);
  expectFace(facesOf(XmpPacket(packet.bytes()), {change.after, change.after, {}, 1}), 0.7, 0.5, 0.8,
             0.7);
}

TEST(XmpRegions, OfProgramsThatApplyThemToTheUprightPictureStayThere) {
  for (const int orientation : {5, 6, 7, 8}) {
    XmpPacket packet(xmpPacket(workingGroup(300, 400) + microsoft("0.5, 0.2, 0.2, 0.1")));
    const PictureChange change = upright(orientation);
    expectFace(facesOf(packet, change), 0.5, 0.2, 0.7, 0.3);
    turnRegions(packet, change);
    EXPECT_FALSE(packet.changed());
    const PictureChange further = upright(orientation, 180);
    turnRegions(packet, further);
    expectFace(facesOf(packet, {further.after, further.after, {}, 1}), 0.3, 0.7, 0.5, 0.8);
  }
}

// What a region says of its roll: in a program's radians, in a phone's degrees.
std::string rotation(const std::string& radians) {
  return "<mwg-rs:Rotation>" + radians + "</mwg-rs:Rotation>";
}
std::string extensions(int roll, int yaw) {
  return "<mwg-rs:Extensions apple-fi:AngleInfoRoll='" + std::to_string(roll) +
         "' apple-fi:AngleInfoYaw='" + std::to_string(yaw) + "' apple-fi:FaceID='7'/>";
}
const std::string sameArea =
    "stArea:x='0.6' stArea:y='0.25' stArea:w='0.2' stArea:h='0.1' stArea:unit='normalized'";

TEST(XmpRegions, WhoseContentsLieAsStoredReferToTheStoredPictureWhateverSizeTheyState) {
  struct {
    int orientation;
    const char* radians;
    int degrees;
  } const upright90[] = {{6, "-1.41981", 270}, {8, "1.6", 90}, {5, "-1.5", 270}, {7, "1.5708", 90}};
  for (const auto& [orientation, radians, degrees] : upright90) {
    for (const std::string& roll : {rotation(radians), extensions(degrees, 0)}) {
      XmpPacket packet(xmpPacket(workingGroup(300, 400, sameArea, roll)));
      const PictureChange change = upright(orientation);
      const auto [left, top, right, bottom] = uprightFace(orientation);
      expectFace(facesOf(packet, change), left, top, right, bottom);
      turnRegions(packet, change);
      expectFace(facesOf(packet, {change.after, change.after, {}, 1}), left, top, right, bottom);
    }
  }
}

TEST(XmpRegions, SayHowFarTheirContentsAreTurned) {
  const auto regionOf = [](const XmpPacket& packet) {
    return packet.property({mwg, "Regions"}).field({mwg, "RegionList"}).items()[0];
  };
  const auto radians = [&](const std::string& text, const PictureChange& change) {
    XmpPacket packet(xmpPacket(workingGroup(400, 300, sameArea, rotation(text))));
    turnRegions(packet, change);
    return regionOf(packet).field({mwg, "Rotation"}).text();
  };
  EXPECT_EQ(radians("0.25", upright(1)), "0.25");
  EXPECT_NEAR(std::stod(radians("-1.57079633", upright(6))), 0, 1e-8);
  EXPECT_EQ(radians("-1.41981", upright(6)), "0.150986327");
  EXPECT_EQ(radians("0.25", upright(2)), "-0.25");
  EXPECT_EQ(radians("3", upright(1, 90)), "-1.71238898");
  const auto degrees = [&](int roll, int yaw, const PictureChange& change) {
    XmpPacket packet(xmpPacket(workingGroup(400, 300, sameArea, extensions(roll, yaw))));
    turnRegions(packet, change);
    const XmpProperty face = regionOf(packet).field({mwg, "Extensions"});
    constexpr std::string_view apple = "http://ns.apple.com/faceinfo/1.0/";
    EXPECT_EQ(face.field({apple, "FaceID"}).text(), "7");
    return face.field({apple, "AngleInfoRoll"}).text() + " " +
           face.field({apple, "AngleInfoYaw"}).text();
  };
  EXPECT_EQ(degrees(270, 45, upright(6)), "0 45");
  EXPECT_EQ(degrees(180, 0, upright(3)), "0 0");
  EXPECT_EQ(degrees(30, 315, upright(2)), "330 45");
  EXPECT_EQ(degrees(300, 0, upright(1, 90)), "30 0");
}

TEST(XmpRegions, WhoseNameWasDeniedAreNoFaces) {
  EXPECT_TRUE(facesOf(XmpPacket(xmpPacket(acdsee("denied"))), upright(1)).empty());
}

TEST(XmpRegions, StateTheSizeOfThePicture) {
  XmpPacket packet(xmpPacket(workingGroup(4000, 3000)));
  turnRegions(packet, upright(6));
  const XmpProperty applied = packet.property({mwg, "Regions"}).field({mwg, "AppliedToDimensions"});
  EXPECT_EQ(applied.field({"http://ns.adobe.com/xap/1.0/sType/Dimensions#", "w"}).text(), "300");
  EXPECT_EQ(applied.field({"http://ns.adobe.com/xap/1.0/sType/Dimensions#", "h"}).text(), "400");
}

TEST(XmpRegions, InPixelsAreScaledToo) {
  XmpPacket packet(xmpPacket(workingGroup(
      400, 300, "stArea:x='240' stArea:y='75' stArea:w='80' stArea:h='30' stArea:unit='pixel'")));
  PictureChange change = upright(6);
  change.after = {150, 200};
  turnRegions(packet, change);
  const XmpProperty area =
      packet.property({mwg, "Regions"}).field({mwg, "RegionList"}).items()[0].field({mwg, "Area"});
  EXPECT_EQ(area.field({areaSpace, "x"}).text(), "112.5");
  EXPECT_EQ(area.field({areaSpace, "y"}).text(), "120");
  EXPECT_EQ(area.field({areaSpace, "w"}).text(), "15");
  EXPECT_EQ(area.field({areaSpace, "h"}).text(), "40");
}

TEST(XmpRegions, HaveTheSameNumbersInEveryLocale) {
  const auto editedPacket = [] {
    XmpPacket packet(xmpPacket(workingGroup(400, 300) + microsoft("0.5,0.2,0.2,0.1")));
    expectFace(facesOf(packet, upright(6)), 0.7, 0.5, 0.8, 0.7);
    turnRegions(packet, upright(6));
    return packet.bytes();
  };
  const std::string expected = editedPacket();
  {
    const test_support::CommaLocale locale;
    EXPECT_EQ(editedPacket(), expected);
  }
  const test_support::CommaNumbers numbers;
  if (std::strtod("0,5", nullptr) != 0.5)
    GTEST_SKIP() << "this C library takes no locale of a test";
  EXPECT_EQ(editedPacket(), expected);
}

TEST(XmpRegions, OfAnotherCropStayAsTheyAreAndAreNoFaces) {
  const std::string bytes = xmpPacket(workingGroup(400, 400));
  XmpPacket packet(bytes);
  turnRegions(packet, upright(6));
  EXPECT_EQ(packet.bytes(), bytes);
  EXPECT_TRUE(facesOf(packet, upright(6)).empty());
}

TEST(XmpRegions, ThatSeveralDialectsTellOfAreOneFace) {
  const XmpPacket packet(
      xmpPacket(workingGroup(400, 300) + microsoft("0.5,0.2,0.2,0.1") + acdsee()));
  expectFace(facesOf(packet, upright(1)), 0.5, 0.2, 0.7, 0.3);
}

TEST(XmpRegions, OfIptcAreTurned) {
  XmpPacket packet(xmpPacket(
      "<rdf:Description><Iptc4xmpExt:ImageRegion><rdf:Bag><rdf:li rdf:parseType='Resource'>"
      "<Iptc4xmpExt:RegionBoundary Iptc4xmpExt:rbShape='rectangle' Iptc4xmpExt:rbUnit='relative' "
      "Iptc4xmpExt:rbX='0.5' Iptc4xmpExt:rbY='0.2' Iptc4xmpExt:rbW='0.2' Iptc4xmpExt:rbH='0.1'/>"
      "</rdf:li><rdf:li rdf:parseType='Resource'><Iptc4xmpExt:RegionBoundary "
      "rdf:parseType='Resource'><Iptc4xmpExt:rbShape>polygon</Iptc4xmpExt:rbShape>"
      "<Iptc4xmpExt:rbUnit>pixel</Iptc4xmpExt:rbUnit><Iptc4xmpExt:rbVertices><rdf:Seq><rdf:li "
      "Iptc4xmpExt:rbX='100' Iptc4xmpExt:rbY='30'/></rdf:Seq></Iptc4xmpExt:rbVertices>"
      "</Iptc4xmpExt:RegionBoundary></rdf:li></rdf:Bag></Iptc4xmpExt:ImageRegion>"
      "</rdf:Description>"));
  PictureChange change = upright(6);
  change.after = {150, 200};
  turnRegions(packet, change);
  constexpr std::string_view space = "http://iptc.org/std/Iptc4xmpExt/2008-02-29/";
  const auto items = packet.property({space, "ImageRegion"}).items();
  const XmpProperty rectangle = items[0].field({space, "RegionBoundary"});
  EXPECT_EQ(rectangle.field({space, "rbX"}).text(), "0.7");
  EXPECT_EQ(rectangle.field({space, "rbY"}).text(), "0.5");
  EXPECT_EQ(rectangle.field({space, "rbW"}).text(), "0.1");
  EXPECT_EQ(rectangle.field({space, "rbH"}).text(), "0.2");
  const XmpProperty vertex =
      items[1].field({space, "RegionBoundary"}).field({space, "rbVertices"}).items()[0];
  EXPECT_EQ(vertex.field({space, "rbX"}).text(), "135");
  EXPECT_EQ(vertex.field({space, "rbY"}).text(), "50");
}

TEST(XmpRegions, ThatAreNoNumbersStayAsTheyAre) {
  for (const std::string& text :
       {workingGroup(400, 300, "stArea:x='nan' stArea:y='1e999' stArea:w='x' stArea:h=''"),
        workingGroup(-1, 0),
        workingGroup(300, 400, sameArea, rotation("1e300") + extensions(2147483647, -2147483647)),
        microsoft("1,2,3"), microsoft("1,2,3,4,5"), microsoft(",,,"),
        std::string("<rdf:Description><mwg-rs:Regions/><MP:RegionInfo/></rdf:Description>")}) {
    XmpPacket packet(xmpPacket(text));
    facesOf(packet, upright(6));
    turnRegions(packet, upright(6));
    EXPECT_EQ(packet.bytes().find("='inf"), std::string::npos);
    EXPECT_EQ(packet.bytes().find("=\"inf"), std::string::npos);
    EXPECT_EQ(packet.bytes().find(">inf"), std::string::npos);
  }
}

}  // namespace
}  // namespace pelorin::photo
