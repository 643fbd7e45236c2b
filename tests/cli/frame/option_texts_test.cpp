#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "cli/frame/errors.h"
#include "cli/frame/faces.h"
#include "cli/frame/filter_options.h"
#include "cli/frame/look_name.h"
#include "cli/frame/nearest_name.h"
#include "cli/frame/number_text.h"
#include "cli/frame/raw_option.h"
#include "photo/photo_error.h"

namespace pelorin::cli {
namespace {

TEST(NearestName, TakesTheFewestChanges) {
  const std::vector<std::string> names = {"AE0", "AE08bit", "PassThrough", "WinterRGB"};
  EXPECT_EQ(nearestName("AE1", names), "AE0");
  EXPECT_EQ(nearestName("ae08bit", names), "AE08bit");
  EXPECT_EQ(nearestName("passthru", names), "PassThrough");
  EXPECT_EQ(nearestName("winter", names), "WinterRGB");
  EXPECT_EQ(nearestName("", names), "");
  EXPECT_EQ(nearestName("frobnicate", names), "");
  EXPECT_EQ(nearestName("x", {}), "");
}

TEST(NearestName, IsPartOfTheMessage) {
  EXPECT_EQ(unknownName("filter", "AE1", {"AE0"}), "unknown filter 'AE1'; did you mean 'AE0'?");
  EXPECT_EQ(unknownName("filter", "AE1", {}), "unknown filter 'AE1'");
}

TEST(Numbers, AreFiniteAndWhole) {
  EXPECT_EQ(readFiniteNumber("--x", "-1.5e-1"), -0.15f);
  for (const char* text : {"", "nan", "inf", "-inf", "0.4x", " 0.4", "0,4", "1e99"}) {
    EXPECT_THROW(readFiniteNumber("--x", text), UsageError) << text;
  }
  EXPECT_EQ(readPositiveInteger("--x", "4294967295"), 4294967295u);
  for (const char* text : {"", "0", "-1", "1.5", "4294967296", "7x"}) {
    EXPECT_THROW(readPositiveInteger("--x", text), UsageError) << text;
  }
}

TEST(Numbers, KeepEveryFloatInNineDigits) {
  for (const float value : {0.1f, 1.0f / 3, 0.999999940f, 1e-30f, 16777215.0f}) {
    EXPECT_EQ(static_cast<float>(nineDigits(value)), value);
  }
  EXPECT_EQ(nineDigits(0.1f), 0.100000001);
}

TEST(FaceOption, BecomesABoxByTruncation) {
  const auto metadata = metadataWithFaces(readFaces({"0.25,0.1,0.75,0.6"}), 400, 300);
  ASSERT_EQ(metadata.faces.size(), 1u);
  EXPECT_EQ(metadata.faces[0]->left, 100);
  EXPECT_EQ(metadata.faces[0]->right, 300);
  EXPECT_EQ(metadata.faces[0]->top, 30);
  EXPECT_EQ(metadata.faces[0]->bottom, 180);
}

TEST(FaceOption, OfFractionsIsNotClamped) {
  const auto metadata = metadataWithFaces(readFaces({"-9e9,-0.019,1.5,1.019"}), 100, 100);
  EXPECT_EQ(metadata.faces[0]->left, std::numeric_limits<std::int32_t>::min());
  EXPECT_EQ(metadata.faces[0]->top, -1);
  EXPECT_EQ(metadata.faces[0]->right, 150);
  EXPECT_EQ(metadata.faces[0]->bottom, 101);
}

TEST(FaceOption, NeedsFourNumbers) {
  for (const char* text : {"", "1", "0,0,1", "0,0,1,1,1", "0,0,1,x", "0,0,1,nan", "0,,1,1"}) {
    EXPECT_THROW(readFaces({text}), UsageError) << text;
  }
}

TEST(FaceOption, IsInPixelsWhenANumberIsAboveTwo) {
  const auto faces = readFaces({"100,50,300,250", "-5,0,1,3", "0,0,2,2"});
  const auto metadata = metadataWithFaces(faces, 400, 300);
  EXPECT_EQ(metadata.faces[0]->left, 100);
  EXPECT_EQ(metadata.faces[0]->top, 50);
  EXPECT_EQ(metadata.faces[0]->right, 300);
  EXPECT_EQ(metadata.faces[0]->bottom, 250);
  EXPECT_EQ(metadata.faces[1]->left, -5);
  EXPECT_EQ(metadata.faces[1]->right, 1);
  EXPECT_EQ(metadata.faces[2]->right, 800);  // fractions still

  const auto scaled = metadataWithFaces(readFaces({"101,50,300,251"}), 100, 75, /*scale=*/4);
  EXPECT_EQ(scaled.faces[0]->left, 25);
  EXPECT_EQ(scaled.faces[0]->top, 12);
  EXPECT_EQ(scaled.faces[0]->right, 75);
  EXPECT_EQ(scaled.faces[0]->bottom, 62);
}

TEST(FaceOption, IsRefusedWhereItWouldBeIgnored) {
  for (const char* text : {
           "0.6,0.1,0.4,0.4",   // left of 0.4 is right of 0.6
           "0.4,0.4,0.6,0.1",   // upside down
           "300,50,100,250",    // the same in pixels
           "0.4,0.1,300,250",   // neither
           "100.5,50,300,250",  // no pixel
           "1,0,1.5,0.5",       // beside the picture
           "0,1.2,0.5,1.5",     // below it
           "-0.5,0,-0.1,1",     // left of it
           "-30,-20,-10,250",   // the same in pixels
       }) {
    EXPECT_THROW(readFaces({text}), UsageError) << text;
  }
  const auto beside = readFaces({"400,50,500,250"}), below = readFaces({"0,300,500,350"});
  EXPECT_NO_THROW(metadataWithFaces(beside, 401, 300));
  EXPECT_THROW(metadataWithFaces(beside, 400, 300), photo::PhotoError);
  EXPECT_THROW(metadataWithFaces(below, 400, 300), photo::PhotoError);
  EXPECT_THROW(metadataWithFaces(beside, 100, 75, /*scale=*/4), photo::PhotoError);
}

TEST(RawOption, IsTwoWholeNumbers) {
  EXPECT_EQ(readRawSize("640x480"), (photo::PictureSize{640, 480}));
  EXPECT_EQ(readRawSize(""), std::nullopt);
  for (const char* text : {"640", "x", "640x", "x480", "0x5", "5x0", "640X480", "6x4x8", "-1x5"}) {
    EXPECT_THROW(readRawSize(text), UsageError) << text;
  }
  EXPECT_EQ(readRawSize("6x4", {{}, false}), (photo::PictureSize{6, 4}));
  EXPECT_THROW(readRawSize("6x4", {{}, true}), UsageError);
  EXPECT_EQ(readRawSize("", {{}, true}), std::nullopt);
}

TEST(FilterOptions, AreCalledAsTheirKeys) {
  EXPECT_EQ(optionFor("slider"), "--slider");
  EXPECT_EQ(optionFor("maskRadius"), "--mask-radius");
  EXPECT_EQ(optionFor("gtmExtraMemory"), "--gtm-extra-memory");
  EXPECT_EQ(optionFor("applyMask"), "--mask");
}

TEST(FilterOptions, RefuseATextThatTheFilterWouldTakeOtherwise) {
  const auto& filter = filterNamed("WinterRGB");
  EXPECT_EQ(parameterItem(filter, "maskAlpha", "--x", "0.5"), "maskAlpha=0.5;");
  for (const char* text : {"", "2", "nan", "0.5x", "0;1", "0.5;r=0,1,"}) {
    EXPECT_THROW(parameterItem(filter, "maskAlpha", "--x", text), UsageError) << text;
  }
}

TEST(Filters, AreFoundByTheirExactNameOnly) {
  EXPECT_EQ(filterNamed("AE0").name, "AE0");
  for (const char* name : {"ae0", "Auto", "Original", "", "AE0 "}) {
    EXPECT_THROW(filterNamed(name), UsageError) << name;
  }
}

}  // namespace
}  // namespace pelorin::cli
