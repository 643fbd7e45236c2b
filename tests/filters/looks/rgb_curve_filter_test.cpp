#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <thread>

#include "image_processing/filters/looks/abstract_rgb_curve_filter.h"
#include "image_processing/filters/looks/preset_looks.h"
#include "tests/support/looks.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::applied;
using test_support::flatPicture;
using test_support::photoLikePicture;
using test_support::stateOf;

bool samePixels(const Image<RGBA8Pixel>& a, const Image<RGBA8Pixel>& b) {
  return a.pixelCount() == b.pixelCount() &&
         std::memcmp(a.data.get(), b.data.get(), a.byteSize()) == 0;
}

// A filter of our own: straight curves, and a vignette that would be seen.
class StraightFilter : public AbstractRGBCurveFilter<StraightFilter> {
 public:
  using AbstractRGBCurveFilter::AbstractRGBCurveFilter;

  void getRGBCurves(std::vector<float>& red, std::vector<float>& green, std::vector<float>& blue,
                    const std::string&) override {
    for (std::vector<float>* curve : {&red, &green, &blue}) *curve = {0.0f, 255.0f};
  }
};

TEST(RGBCurveFilter, LeavesThePictureAloneWithStraightCurvesAndNoVignette) {
  const Image<RGBA8Pixel> picture = photoLikePicture(61, 47, 1);
  EXPECT_TRUE(samePixels(applied<StraightFilter>(picture), picture));
}

TEST(RGBCurveFilter, ParsesCurvesAndMaskSettingsAsItsMembers) {
  const StraightFilter filter(stateOf(flatPicture(1, 1, {1, 2, 3, 4})));
  std::vector<float> red{1.0f, 2.0f}, green{3.0f, 4.0f}, blue{5.0f, 6.0f};
  const std::string params = "g=1,0,;maskRadius=1.5;maskAlpha=0.25;applyMask=1;";
  filter.parseRGBCurves(red, green, blue, params);
  EXPECT_EQ(red, (std::vector{1.0f, 2.0f}));
  EXPECT_EQ(green, (std::vector{255.0f, 0.0f}));
  EXPECT_EQ(blue, (std::vector{5.0f, 6.0f}));
  float radius = 1.0f, alpha = 1.0f;
  bool apply = false;
  filter.parseMaskParameters(radius, alpha, apply, params);
  EXPECT_EQ(radius, 1.5f);
  EXPECT_EQ(alpha, 0.25f);
  EXPECT_TRUE(apply);
}

TEST(RGBCurveFilter, LooksUpNoMaskWithoutTheVignette) {
  // A radius of NaN would be felt in every look-up.
  const Image<RGBA8Pixel> picture = photoLikePicture(61, 47, 1);
  EXPECT_TRUE(
      samePixels(applied<StraightFilter>(picture, "maskRadius=nan;maskAlpha=nan;"), picture));
}

TEST(RGBCurveFilter, LeavesChannelsAloneAtMaskAlphaZero) {
  const Image<RGBA8Pixel> picture = photoLikePicture(61, 47, 1);
  EXPECT_TRUE(samePixels(applied<StraightFilter>(picture, "applyMask=1;maskAlpha=0;"), picture));
  EXPECT_FALSE(samePixels(applied<StraightFilter>(picture, "applyMask=1;maskAlpha=1;"), picture));
}

TEST(RGBCurveFilter, HasItsOwnVignetteAgainAfterAnotherInit) {
  StraightFilter filter(stateOf(flatPicture(3, 2, {50, 100, 150, 255})));
  filter.init("");
  filter.lookFor("maskRadius=3;maskAlpha=0.5;applyMask=1;");
  const Look kept = filter.lookFor("");
  EXPECT_EQ(kept.maskRadius, 3.0f);
  EXPECT_EQ(kept.maskAlpha, 0.5f);
  EXPECT_NE(kept.vignette, nullptr);
  filter.init("");
  const Look own = filter.lookFor("");
  EXPECT_EQ(own.maskRadius, StraightFilter::maskRadius);
  EXPECT_EQ(own.maskAlpha, StraightFilter::maskAlpha);
  EXPECT_EQ(own.vignette, nullptr);
}

TEST(RGBCurveFilter, ReplacesACurveByTwoSamplesButNotByOne) {
  const Image<RGBA8Pixel> picture = flatPicture(3, 2, {100, 100, 100, 1});
  const std::string off = "applyMask=0;";
  const RGBA8Pixel preset = *applied<WinterRGBFilter>(picture, off).data;
  const RGBA8Pixel replaced = *applied<WinterRGBFilter>(picture, off + "r=0,1,;").data;
  EXPECT_EQ(replaced, (RGBA8Pixel{100, preset.g, preset.b, 1}));
  EXPECT_NE(replaced.r, preset.r);
  EXPECT_EQ(*applied<WinterRGBFilter>(picture, off + "r=0,1;").data, preset);
}

TEST(RGBCurveFilter, KeepsMaskOverridesForLaterApplications) {
  const Image<RGBA8Pixel> picture = photoLikePicture(40, 30, 2);
  SummerRGBFilter filter(stateOf(picture));
  filter.init("");
  const Image<RGBA8Pixel> withMask = applied(filter, 40, 30, "");
  const Image<RGBA8Pixel> off = applied(filter, 40, 30, "applyMask=0;");
  EXPECT_FALSE(samePixels(withMask, off));
  EXPECT_TRUE(samePixels(applied(filter, 40, 30, ""), off));
  EXPECT_TRUE(samePixels(applied(filter, 40, 30, "applyMask=1;"), withMask));
  EXPECT_TRUE(samePixels(applied(filter, 40, 30, ""), withMask));
  const Image<RGBA8Pixel> wide = applied(filter, 40, 30, "maskRadius=1.1;");
  EXPECT_FALSE(samePixels(wide, withMask));
  EXPECT_TRUE(samePixels(applied(filter, 40, 30, "unknown=1;"), wide));
}

TEST(RGBCurveFilter, ForgetsCurveOverrides) {
  const Image<RGBA8Pixel> picture = photoLikePicture(40, 30, 2);
  SummerRGBFilter filter(stateOf(picture));
  filter.init("");
  const Image<RGBA8Pixel> preset = applied(filter, 40, 30, "");
  EXPECT_FALSE(samePixels(applied(filter, 40, 30, "r=1,0,;"), preset));
  EXPECT_TRUE(samePixels(applied(filter, 40, 30, ""), preset));
}

TEST(RGBCurveFilter, ReadsNoParametersWhenInitialised) {
  const Image<RGBA8Pixel> picture = photoLikePicture(40, 30, 2);
  SummerRGBFilter filter(stateOf(picture));
  filter.init("applyMask=0;r=1,0,;");
  EXPECT_TRUE(samePixels(applied(filter, 40, 30, ""), applied<SummerRGBFilter>(picture)));
}

TEST(RGBCurveFilter, IsItsOldSelfWhenInitialisedAgain) {
  const Image<RGBA8Pixel> picture = photoLikePicture(40, 30, 2);
  SummerRGBFilter filter(stateOf(picture));
  filter.init("");
  applied(filter, 40, 30, "applyMask=0;");
  filter.init("");
  EXPECT_TRUE(samePixels(applied(filter, 40, 30, ""), applied<SummerRGBFilter>(picture)));
}

TEST(RGBCurveFilter, StoresTheLowEightBitsOfTheFloor) {
  const Image<RGBA8Pixel> picture = flatPicture(2, 1, {255, 255, 255, 0});
  const auto top = [&](const std::string& value) {
    return applied<StraightFilter>(picture, std::string("r=0,").append(value).append(",;")).data->r;
  };
  EXPECT_EQ(top("1"), 255);
  EXPECT_EQ(top("0.9999"), 254);
  EXPECT_EQ(top("1.01"), 1);  // 257.55
  EXPECT_EQ(top("2"), 254);   // 510
  EXPECT_EQ(top("-0.001"), 0);
  EXPECT_EQ(top("-3"), 0);
  EXPECT_EQ(top("1e30"), 255);
}

TEST(RGBCurveFilter, CopiesAlpha) {
  const Image<RGBA8Pixel> picture = photoLikePicture(500, 400, 2);
  for (const char* params : {"", "applyMask=0;", "maskAlpha=nan;"}) {
    const Image<RGBA8Pixel> output = applied<VintageRGBFilter>(picture, params);
    for (std::size_t i = 0; i < output.pixelCount(); ++i) {
      ASSERT_EQ(output.data.get()[i].a, picture.data.get()[i].a) << params << i;
    }
  }
}

TEST(RGBCurveFilter, LeavesItsSourceAlone) {
  const Image<RGBA8Pixel> picture = photoLikePicture(500, 400, 2);
  applied<ZebraBWFilter>(picture);
  EXPECT_TRUE(samePixels(picture, photoLikePicture(500, 400, 2)));
}

TEST(RGBCurveFilter, DarkensTheBorderAndLiftsTheCentre) {
  const Image<RGBA8Pixel> grey = flatPicture(80, 60, {128, 128, 128, 255});
  const Image<RGBA8Pixel> output = applied<StraightFilter>(grey, "applyMask=1;maskRadius=1.6;");
  EXPECT_LT(output.row(0)[0].r, 100);
  EXPECT_GT(output.row(30)[40].r, 150);
  EXPECT_EQ(output.row(30)[40].r, output.row(30)[40].b);
}

TEST(RGBCurveFilter, ServesTwoThreadsAtOnce) {
  const Image<RGBA8Pixel> picture = photoLikePicture(400, 260, 4);
  const std::vector<std::string> wishes = {
      "maskRadius=1.5;maskAlpha=0.9;applyMask=1;r=0,0.5,1,;",
      "maskRadius=2.5;maskAlpha=0.2;applyMask=0;",
  };
  std::vector<Image<RGBA8Pixel>> expected;
  for (const std::string& wish : wishes)
    expected.push_back(applied<VintageRGBFilter>(picture, wish));

  VintageRGBFilter filter(stateOf(picture));
  filter.init("");
  std::vector<int> differences(wishes.size());
  std::vector<std::thread> threads;
  for (std::size_t t = 0; t < wishes.size(); ++t) {
    threads.emplace_back([&, t] {
      for (int round = 0; round < 10; ++round) {
        differences[t] += !samePixels(applied(filter, 400, 260, wishes[t]), expected[t]);
      }
    });
  }
  for (std::thread& thread : threads) thread.join();
  EXPECT_EQ(differences, std::vector<int>(wishes.size()));
}

}  // namespace
}  // namespace pelorin::image_processing
