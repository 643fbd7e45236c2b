#include "image_processing/filters/looks/low_dim_rgb_curve_filter.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cmath>

#include "tests/support/fingerprint.h"
#include "tests/support/looks.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

struct LowDimCurves {
  std::vector<float> red, green, blue;

  explicit LowDimCurves(const std::string& params) {
    LowDimRGBCurveFilter(nullptr).getRGBCurves(red, green, blue, params);
  }
  friend bool operator==(const LowDimCurves&, const LowDimCurves&) = default;
};

TEST(LowDimRGBCurveFilter, StartsFromTheMeanWithoutParameters) {
  const LowDimCurves curves("");
  EXPECT_EQ(curves.red.front(), 0.05822621f * 255.0f);
  EXPECT_EQ(curves.red.back(), 0.955746f * 255.0f);
  EXPECT_EQ(curves.green.front(), 0.06365407f * 255.0f);
  EXPECT_EQ(curves.blue.back(), 0.9387872f * 255.0f);
  EXPECT_EQ(curves, LowDimCurves("s1=0.5;s2=0.5;s3=0.5;s4=0.5;"));
}

TEST(LowDimRGBCurveFilter, IsMildButNotTheIdentityByDefault) {
  const Image<RGBA8Pixel> black = test_support::flatPicture(2, 2, {0, 0, 0, 9});
  const Image<RGBA8Pixel> white = test_support::flatPicture(2, 2, {255, 255, 255, 9});
  EXPECT_EQ(*test_support::applied<LowDimRGBCurveFilter>(black).data, (RGBA8Pixel{14, 16, 19, 9}));
  EXPECT_EQ(*test_support::applied<LowDimRGBCurveFilter>(white).data,
            (RGBA8Pixel{243, 243, 239, 9}));
}

TEST(LowDimRGBCurveFilter, HasElevenSamplesACurve) {
  const LowDimCurves curves("s1=0.9;");
  EXPECT_EQ(curves.red.size(), 11u);
  EXPECT_EQ(curves.green.size(), 11u);
  EXPECT_EQ(curves.blue.size(), 11u);
  EXPECT_EQ(LookCurve(curves.red).samplesPerUnit(), 10.0f / 255.0f);
}

TEST(LowDimRGBCurveFilter, ClampsItsParameters) {
  EXPECT_EQ(LowDimCurves("s1=1.5;"), LowDimCurves("s1=1;"));
  EXPECT_EQ(LowDimCurves("s3=-7;"), LowDimCurves("s3=0;"));
  EXPECT_EQ(LowDimCurves("s4=inf;"), LowDimCurves("s4=1;"));
  EXPECT_FALSE(LowDimCurves("s1=1;") == LowDimCurves("s1=0;"));
}

TEST(LowDimRGBCurveFilter, WeighsEveryComponentByItsParameter) {
  // One weight at a time, at a sample that no clamp and no running maximum touches.
  const auto atFifth = [](const std::string& params) { return LowDimCurves(params).blue[5]; };
  EXPECT_FLOAT_EQ(atFifth("s1=1;"), 255.0f * (0.46027565f * 0.3223142f + 0.5550708f));
  EXPECT_FLOAT_EQ(atFifth("s2=1;"), 255.0f * (0.40102503f * 0.01667022f + 0.5550708f));
  EXPECT_FLOAT_EQ(atFifth("s3=1;"), 255.0f * (0.307871f * 0.08742924f + 0.5550708f));
  EXPECT_FLOAT_EQ(atFifth("s4=1;"), 255.0f * (0.25171766f * 0.1366303f + 0.5550708f));
  EXPECT_FLOAT_EQ(atFifth("s4=0;"), 255.0f * (-0.25171766f * 0.1366303f + 0.5550708f));
}

TEST(LowDimRGBCurveFilter, HoldsACurveLevelWhereItWouldFall) {
  bool flat = false;
  for (int corner = 0; corner < 16; ++corner) {
    const std::string keys[] = {"s1", "s2", "s3", "s4"};
    std::string params;
    for (int i = 0; i < 4; ++i) {
      params += keys[i] + ((corner >> i & 1) != 0 ? "=1;" : "=0;");
    }
    const LowDimCurves curves(params);
    for (const std::vector<float>* curve : {&curves.red, &curves.green, &curves.blue}) {
      EXPECT_GE(curve->front(), 0.0f) << params;
      EXPECT_LE(curve->back(), 255.0f) << params;
      for (std::size_t i = 1; i < curve->size(); ++i) {
        EXPECT_GE((*curve)[i], (*curve)[i - 1]) << params;
        const float level = (*curve)[i];
        flat = flat || (level == (*curve)[i - 1] && level > 0.0f && level < 255.0f);
      }
    }
  }
  EXPECT_TRUE(flat);
}

TEST(LowDimRGBCurveFilter, HasItsGoldenCurvesAllOverTheParameters) {
  std::vector<float> all;
  for (int n = 0; n < 625; ++n) {
    static constexpr const char* values[] = {"0;", "0.25;", "0.5;", "0.75;", "1;"};
    const LowDimCurves curves(std::string("s1=") + values[n % 5] + "s2=" + values[n / 5 % 5] +
                              "s3=" + values[n / 25 % 5] + "s4=" + values[n / 125]);
    for (const std::vector<float>* curve : {&curves.red, &curves.green, &curves.blue}) {
      all.insert(all.end(), curve->begin(), curve->end());
    }
  }
  EXPECT_EQ(test_support::fingerprint(all.data(), all.size() * sizeof(float)), "dbfc544167170c3b");
}

TEST(LowDimRGBCurveFilter, TakesTheLastOfSeveralItemsWithOneKeyAndDropsTheTail) {
  EXPECT_EQ(LowDimCurves("s1=0.2;s1=0.7;"), LowDimCurves("s1=0.7;"));
  EXPECT_EQ(LowDimCurves("s1=0.2;s1=0.7"), LowDimCurves("s1=0.2;"));
  EXPECT_EQ(LowDimCurves(" s1=0.2;"), LowDimCurves(""));
  EXPECT_EQ(LowDimCurves("s1=abc;"), LowDimCurves("s1=0;"));
}

TEST(LowDimRGBCurveFilter, DrawsANaNParameterAsBlack) {
  const Image<RGBA8Pixel> picture = test_support::noisePicture(20, 10, 3);
  const Image<RGBA8Pixel> output = test_support::applied<LowDimRGBCurveFilter>(picture, "s2=nan;");
  for (std::size_t i = 0; i < output.pixelCount(); ++i) {
    EXPECT_EQ(output.data.get()[i], (RGBA8Pixel{0, 0, 0, picture.data.get()[i].a}));
  }
}

TEST(LowDimRGBCurveFilter, HasNoVignetteUnlessAskedFor) {
  const Image<RGBA8Pixel> grey = test_support::flatPicture(64, 48, {128, 128, 128, 255});
  const Image<RGBA8Pixel> plain = test_support::applied<LowDimRGBCurveFilter>(grey);
  EXPECT_EQ(plain.row(0)[0], plain.row(24)[32]);
  const Image<RGBA8Pixel> masked =
      test_support::applied<LowDimRGBCurveFilter>(grey, "applyMask=1;");
  EXPECT_LT(masked.row(0)[0].g, plain.row(0)[0].g);
  EXPECT_GT(masked.row(24)[32].g, plain.row(24)[32].g);
}

}  // namespace
}  // namespace pelorin::image_processing
