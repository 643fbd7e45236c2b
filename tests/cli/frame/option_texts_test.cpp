#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "cli/frame/errors.h"
#include "cli/frame/faces.h"
#include "cli/frame/filter_parameters.h"
#include "cli/frame/nearest_name.h"
#include "cli/frame/number_text.h"
#include "photo/raw/raw_pixels.h"

namespace pelorin::cli {
namespace {

TEST(NearestName, TakesTheFewestChanges) {
  const std::vector<std::string> names = {"AE0", "AE08bit", "PassThrough", "WinterRGB"};
  EXPECT_EQ(nearestName("AE1", names), "AE0");
  EXPECT_EQ(nearestName("ae08bit", names), "AE08bit");
  EXPECT_EQ(nearestName("passthru", names), "PassThrough");
  EXPECT_EQ(nearestName("winter", names), "WinterRGB");
  EXPECT_EQ(nearestName("", names), "AE0");
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

TEST(FaceOption, IsNeitherClampedNorOrdered) {
  const auto metadata = metadataWithFaces(readFaces({"1.5,-0.019,-9e9,9e9"}), 100, 100);
  EXPECT_EQ(metadata.faces[0]->left, 150);
  EXPECT_EQ(metadata.faces[0]->top, -1);
  EXPECT_EQ(metadata.faces[0]->right, std::numeric_limits<std::int32_t>::min());
  EXPECT_EQ(metadata.faces[0]->bottom, std::numeric_limits<std::int32_t>::max());
}

TEST(FaceOption, NeedsFourNumbers) {
  for (const char* text : {"", "1", "1,2,3", "1,2,3,4,5", "1,2,3,x", "1,2,3,nan", "1,,3,4"}) {
    EXPECT_THROW(readFaces({text}), UsageError) << text;
  }
}

TEST(RawOption, IsTwoWholeNumbers) {
  EXPECT_EQ(readRawSize("640x480").width, 640u);
  EXPECT_EQ(readRawSize("640x480").height, 480u);
  for (const char* text :
       {"", "640", "x", "640x", "x480", "0x5", "5x0", "640X480", "6x4x8", "-1x5"}) {
    EXPECT_THROW(readRawSize(text), UsageError) << text;
  }
}

TEST(FilterParameters, OfAnAutoEnhancementNeedASlider) {
  EXPECT_TRUE(checkParameters("AE0", "slider=0.4;gtmOnly=true;").empty());
  for (const char* params : {"", ";;", "gtmOnly=true;", "slider", "slider=", "slider=0.4x"}) {
    EXPECT_THROW(checkParameters("AE0", params), UsageError) << params;
  }
}

TEST(FilterParameters, ThatAreUnknownNameTheNearest) {
  try {
    checkParameters("AE08bit", "slider=0.4;gmtonly=true;");
    FAIL() << "accepted";
  } catch (const UsageError& error) {
    EXPECT_STREQ(error.what(), "--params: unknown parameter 'gmtonly'; did you mean 'gtmOnly'?");
  }
  EXPECT_THROW(checkParameters("PassThrough", "slider=0.4;"), UsageError);
}

TEST(FilterParameters, ThatReadOtherwiseThanTheyLookAreWarnedOf) {
  EXPECT_EQ(checkParameters("AE0", "slider=nan;gtmOnly=1;").size(), 2u);
  EXPECT_TRUE(checkParameters("PassThrough", "").empty());
}

TEST(FilterParameters, OfALookAreItsCurvesAndItsMask) {
  EXPECT_TRUE(checkParameters("WinterRGB", "").empty());
  EXPECT_TRUE(checkParameters("WinterRGB", "r=0,0.5,1,;applyMask=0;").empty());
  EXPECT_TRUE(checkParameters("LowDimRGBCurve", "s1=0.3;s4=1;").empty());
  EXPECT_EQ(checkParameters("LowDimRGBCurve", "s1=0.3").size(), 1u);  // ends without a ';'
  EXPECT_THROW(checkParameters("WinterRGB", "s1=0.3;"), UsageError);
  EXPECT_THROW(checkParameters("WinterRGB", "slider=0.3;"), UsageError);
}

TEST(FilterParameters, OfALookThatReadOtherwiseThanTheyLookAreWarnedOf) {
  const std::vector<std::pair<const char*, std::string>> cases = {
      {"applyMask=true;", "applyMask: 'true' counts as 0"},
      {"maskAlpha=0.4abc;", "maskAlpha: '0.4abc' counts as 0.4"},
      {"maskRadius=nan;", "maskRadius: 'nan' counts as nan"},
      {"maskAlpha;", "maskAlpha: '' counts as 0"},
      {"s1=1.5;", "s1: 1.5 is not between 0 and 1"},
      {"r=0,128,255,;", "r: 128 is not between 0 and 1"},
      {"g=0,x,;", "g: 'x' counts as 0"},
      {"b=0,0.5,1;", "b: '1' is ignored without a ',' after it"},
      {"r=0.5,;r=0,1,;", "r: a curve of fewer than 2 numbers is ignored"},
      {"g=;", "g: a curve of fewer than 2 numbers is ignored"},
      {"s1=0.3;b=0", "what follows the last ';' is ignored: end every parameter with one"},
  };
  for (const auto& [params, warning] : cases) {
    EXPECT_EQ(checkParameters("LowDimRGBCurve", params), std::vector{warning}) << params;
  }
  EXPECT_TRUE(checkParameters("LowDimRGBCurve", "maskRadius=2.5;applyMask=2;;").empty());
}

TEST(Filters, AreFoundByTheirExactNameOnly) {
  EXPECT_NO_THROW(requireFilter("AE0"));
  for (const char* name : {"ae0", "Auto", "Original", "", "AE0 "}) {
    EXPECT_THROW(requireFilter(name), UsageError) << name;
  }
}

}  // namespace
}  // namespace pelorin::cli
