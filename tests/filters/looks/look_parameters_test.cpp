#include "image_processing/filters/looks/look_parameters.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cmath>

namespace pelorin::image_processing {
namespace {

using testing::ElementsAre;

struct Curves {
  std::vector<float> red{1.0f, 2.0f}, green{3.0f, 4.0f}, blue{5.0f, 6.0f};

  explicit Curves(const std::string& params) { replaceCurves(red, green, blue, params); }
};

struct MaskSettings {
  float radius = 2.28f, alpha = 0.3f;
  bool apply = true;

  explicit MaskSettings(const std::string& params) {
    replaceMaskSettings(radius, alpha, apply, params);
  }
};

TEST(ReplaceCurves, ReplacesACurveWrittenWithATrailingComma) {
  const Curves curves("r=0,1,;");
  EXPECT_THAT(curves.red, ElementsAre(0.0f, 255.0f));
  EXPECT_THAT(curves.green, ElementsAre(3.0f, 4.0f));
  EXPECT_THAT(curves.blue, ElementsAre(5.0f, 6.0f));
}

TEST(ReplaceCurves, IgnoresACurveOfOneSample) {
  EXPECT_THAT(Curves("r=0,1;").red, ElementsAre(1.0f, 2.0f));
  EXPECT_THAT(Curves("r=;").red, ElementsAre(1.0f, 2.0f));
  EXPECT_THAT(Curves("r;").red, ElementsAre(1.0f, 2.0f));
}

TEST(ReplaceCurves, IgnoresAnItemWithoutItsSemicolon) {
  EXPECT_THAT(Curves("r=0,1,").red, ElementsAre(1.0f, 2.0f));
  EXPECT_THAT(Curves("").red, ElementsAre(1.0f, 2.0f));
}

TEST(ReplaceCurves, DropsTheNumberAfterTheLastComma) {
  EXPECT_THAT(Curves("g=0,0.5,1;").green, ElementsAre(0.0f, 127.5f));
}

TEST(ReplaceCurves, TakesTheLastOfSeveralItemsThatCount) {
  EXPECT_THAT(Curves("b=0,1,;b=1,0,;b=1;").blue, ElementsAre(255.0f, 0.0f));
}

TEST(ReplaceCurves, KeepsValuesOutsideTheUnitRangeAndReadsWordsAsZero) {
  const Curves curves("r=-1,2,;g=x,,1abc,;b=nan,1e300,");
  EXPECT_THAT(curves.red, ElementsAre(-255.0f, 510.0f));
  EXPECT_THAT(curves.green, ElementsAre(0.0f, 0.0f, 255.0f));
  const Curves extreme("b=nan,1e300,;");
  EXPECT_TRUE(std::isnan(extreme.blue[0]));
  EXPECT_TRUE(std::isinf(extreme.blue[1]));
}

TEST(ReplaceCurves, ScalesInDoubleAndRoundsOnce) {
  EXPECT_THAT(Curves("r=0.1,0.3,;").red,
              ElementsAre(static_cast<float>(0.1 * 255.0), static_cast<float>(0.3 * 255.0)));
}

TEST(ReplaceCurves, TakesOnlyExactKeys) {
  const Curves curves(" r=0,1,;R=0,1,;rr=0,1,;=0,1,;");
  EXPECT_THAT(curves.red, ElementsAre(1.0f, 2.0f));
}

TEST(ReplaceMaskSettings, ChangesOnlyWhatTheTextNames) {
  const MaskSettings settings("maskAlpha=0.75;s1=0.2;r=0,1,;");
  EXPECT_EQ(settings.alpha, 0.75f);
  EXPECT_EQ(settings.radius, 2.28f);
  EXPECT_TRUE(settings.apply);
}

TEST(ReplaceMaskSettings, ReadsEveryKey) {
  const MaskSettings settings("maskRadius=3.5;maskAlpha=-1e1;applyMask=0;");
  EXPECT_EQ(settings.radius, 3.5f);
  EXPECT_EQ(settings.alpha, -10.0f);
  EXPECT_FALSE(settings.apply);
}

TEST(ReplaceMaskSettings, SwitchesOnForAnyNumberButZero) {
  EXPECT_TRUE(MaskSettings("applyMask=0;applyMask=-0.5;").apply);
  EXPECT_FALSE(MaskSettings("applyMask=-0;").apply);
  EXPECT_FALSE(MaskSettings("applyMask=true;").apply);
  EXPECT_FALSE(MaskSettings("applyMask;").apply);
}

TEST(ReplaceMaskSettings, IgnoresAnItemWithoutItsSemicolon) {
  EXPECT_TRUE(MaskSettings("applyMask=0").apply);
  EXPECT_EQ(MaskSettings("maskRadius=1;maskAlpha=1").alpha, 0.3f);
}

}  // namespace
}  // namespace pelorin::image_processing
