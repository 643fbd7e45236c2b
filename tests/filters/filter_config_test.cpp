#include "image_processing/filters/filter_config.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

namespace pelorin::image_processing {
namespace {

FilterConfig atSlider(float slider) {
  FilterConfig config = defaultFilterConfigValue;
  updateFilterConfigForSliderValue(slider, &config);
  return config;
}

TEST(FilterConfig, HasItsDefaults) {
  for (const FilterConfig& config : {FilterConfig{}, defaultFilterConfigValue}) {
    EXPECT_EQ(config.vibrance, 1.0f);
    EXPECT_EQ(config.slider, 0.0f);
    EXPECT_EQ(config.faceTarget, -1.0f);
    EXPECT_EQ(config.histogramClipLow, 0.75f);
    EXPECT_EQ(config.histogramClipHigh, 8.0f);
    EXPECT_EQ(config.detailGain, 0.2f);
    EXPECT_EQ(config.ltmBlend, 0.0f);
    EXPECT_EQ(config.detailGainLow, 0.2f);
    EXPECT_EQ(config.detailGainHigh, 1.0f);
    EXPECT_EQ(config.bilateralRange, 0.7f);
    EXPECT_EQ(config.bilateralSpatialFraction, 0.025f);
    EXPECT_EQ(config.useBilateralGrid, 1);
    EXPECT_EQ(config.ltmMaskAmount, 1.0f);
    EXPECT_EQ(config.ltmMaskRadius, 8);
    EXPECT_EQ(config.ltmBlendLow, 0.5f);
    EXPECT_EQ(config.ltmBlendHigh, 0.7f);
  }
}

TEST(SliderMapping, IsNeutralAtZeroAndKeepsTheOtherFields) {
  FilterConfig expected = defaultFilterConfigValue;
  expected.vibrance = 1.0f;
  expected.slider = 0.0f;
  expected.faceTarget = 0.0f;
  expected.detailGain = 0.0f;
  expected.ltmBlend = 0.0f;
  EXPECT_EQ(atSlider(0.0f), expected);
}

TEST(SliderMapping, TakesTheHighRampAtThreeTenths) {
  const FilterConfig config = atSlider(0.3f);
  EXPECT_EQ(config.faceTarget, 0.15f);
  EXPECT_EQ(config.vibrance, 1.3f);
  EXPECT_EQ(config.detailGain, config.detailGainLow);
  EXPECT_EQ(config.ltmBlend, config.ltmBlendLow);
  // The low ramp ends at the same numbers, but asks for none of the high ones.
  FilterConfig endless = defaultFilterConfigValue;
  endless.detailGainHigh = std::numeric_limits<float>::infinity();
  updateFilterConfigForSliderValue(0.3f, &endless);
  EXPECT_TRUE(std::isnan(endless.detailGain));
}

TEST(SliderMapping, ReachesTheHighValuesAtOne) {
  const FilterConfig config = atSlider(1.0f);
  EXPECT_EQ(config.vibrance, 1.8f);
  EXPECT_EQ(config.detailGain, config.detailGainHigh);
  EXPECT_EQ(config.ltmBlend, config.ltmBlendHigh);
}

TEST(SliderMapping, ExtrapolatesOutsideTheUnitRange) {
  EXPECT_FLOAT_EQ(atSlider(-0.3f).vibrance, 0.7f);
  EXPECT_LT(atSlider(-0.3f).detailGain, 0.0f);
  EXPECT_GT(atSlider(2.0f).vibrance, 1.8f);
  EXPECT_GT(atSlider(2.0f).detailGain, 1.0f);
}

TEST(SliderMapping, NeverChangesTheFieldsItDoesNotOwn) {
  const float infinity = std::numeric_limits<float>::infinity();
  for (const float slider : {-1.0f, 0.0f, 0.29f, 0.3f, 1.0f, 7.0f, infinity, std::nanf("")}) {
    FilterConfig config = atSlider(slider);
    config.vibrance = defaultFilterConfigValue.vibrance;
    config.slider = defaultFilterConfigValue.slider;
    config.faceTarget = defaultFilterConfigValue.faceTarget;
    config.detailGain = defaultFilterConfigValue.detailGain;
    config.ltmBlend = defaultFilterConfigValue.ltmBlend;
    EXPECT_EQ(config, defaultFilterConfigValue) << slider;
  }
}

TEST(SliderMapping, IsContinuousWhereTheRampsMeet) {
  const FilterConfig below = atSlider(std::nextafterf(0.3f, 0.0f));
  const FilterConfig at = atSlider(0.3f);
  EXPECT_NEAR(below.vibrance, at.vibrance, 1e-5f);
  EXPECT_NEAR(below.faceTarget, at.faceTarget, 1e-5f);
  EXPECT_NEAR(below.detailGain, at.detailGain, 1e-5f);
  EXPECT_NEAR(below.ltmBlend, at.ltmBlend, 1e-5f);
}

}  // namespace
}  // namespace pelorin::image_processing
