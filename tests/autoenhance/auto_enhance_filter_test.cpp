#include "image_processing/autoenhance/auto_enhance_filter.h"

#include <gtest/gtest.h>

#include <boost/lexical_cast.hpp>
#include <cmath>
#include <cstring>
#include <limits>
#include <stdexcept>
#include <type_traits>
#include <utility>

#include "image_processing/autoenhance/enhance_row.h"
#include "image_processing/autoenhance/lightness/build_tone_curve.h"
#include "tests/support/faces.h"
#include "tests/support/filter_state.h"
#include "tests/support/fingerprint.h"
#include "tests/support/new_memory.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::fingerprint;
using test_support::flatPicture;
using test_support::noisePicture;
using test_support::photoLikePicture;
using test_support::stateOf;

template <typename Filter>
class AutoEnhance : public testing::Test {
 protected:
  static Image<RGBA8Pixel> enhanced(const Image<RGBA8Pixel>& photo, const std::string& initParams,
                                    const std::string& params) {
    Filter filter(stateOf(photo));
    filter.init(initParams);
    Image<RGBA8Pixel> output(photo.width, photo.height);
    filter.applyConfig(params, defaultFilterConfigValue, output);
    return output;
  }
};
using BothFilters = testing::Types<AEFilter, AEFilter8bit>;
TYPED_TEST_SUITE(AutoEnhance, BothFilters);

TYPED_TEST(AutoEnhance, GivesTheSourceUpToTheLabConversionAtSliderZero) {
  const auto photo = photoLikePicture(60, 45, 1);
  const auto output = this->enhanced(photo, "slider=0;", "slider=0;");
  long sum = 0;
  for (std::size_t i = 0; i < photo.pixelCount(); ++i) {
    sum += std::abs(photo.data.get()[i].g - output.data.get()[i].g);
  }
  EXPECT_LT(static_cast<double>(sum) / photo.pixelCount(), 2.0);
  EXPECT_NE(fingerprint(this->enhanced(photo, "slider=0.8;", "slider=0.8;")), fingerprint(output));
}

TYPED_TEST(AutoEnhance, TakesTheMaskFreeBranchWhenGlobalOnly) {
  const auto photo = photoLikePicture(60, 45, 2);
  const std::string params = "slider=0.5;gtmOnly=true;";
  TypeParam filter(stateOf(photo));
  filter.init(params);
  EXPECT_THROW(filter.getBilateralMask(), std::logic_error);
  EXPECT_THROW(filter.getLtmMask(), std::logic_error);
  Image<RGBA8Pixel> output(60, 45);
  filter.applyConfig(params, defaultFilterConfigValue, output);
  // The same as with masks computed and switched off for this application.
  EXPECT_EQ(fingerprint(output), fingerprint(this->enhanced(photo, "slider=0.5;", params)));
  EXPECT_NE(fingerprint(output), fingerprint(this->enhanced(photo, "", "slider=0.5;")));
}

TYPED_TEST(AutoEnhance, NeverReadsMasksThatWereAllocatedButNotComputed) {
  const auto photo = photoLikePicture(60, 45, 3);
  const std::string expected =
      fingerprint(this->enhanced(photo, "gtmOnly=true;", "slider=0.5;gtmOnly=true;"));
  EXPECT_EQ(fingerprint(this->enhanced(photo, "gtmOnly=true;", "slider=0.5;")), expected);
  EXPECT_EQ(fingerprint(this->enhanced(photo, "gtmOnly=true;gtmExtraMemory=true;", "slider=0.5;")),
            expected);
  TypeParam filter(stateOf(photo));
  filter.init("gtmOnly=true;gtmExtraMemory=true;");
  EXPECT_THROW(filter.getBilateralMask(), std::logic_error);
}

TYPED_TEST(AutoEnhance, BeginsWithoutMasksAtASecondInit) {
  const auto photo = photoLikePicture(60, 45, 3);
  TypeParam filter(stateOf(photo));
  filter.init("");
  filter.init("gtmOnly=true;");
  EXPECT_THROW(filter.getBilateralMask(), std::logic_error);
  EXPECT_THROW(filter.getLtmMask(), std::logic_error);
  Image<RGBA8Pixel> output(60, 45);
  filter.applyConfig("slider=0.5;", defaultFilterConfigValue, output);
  EXPECT_EQ(fingerprint(output),
            fingerprint(this->enhanced(photo, "gtmOnly=true;", "slider=0.5;gtmOnly=true;")));

  filter.init("");
  filter.applyConfig("slider=0.5;", defaultFilterConfigValue, output);
  EXPECT_EQ(fingerprint(output), fingerprint(this->enhanced(photo, "", "slider=0.5;")));
}

TYPED_TEST(AutoEnhance, TakesNoMemoryForMasksWhenGlobalOnlyUnlessAskedTo) {
  const auto photo = flatPicture(400, 300, {224, 172, 140, 255});
  const auto state = stateOf(photo, test_support::withFaces({{100, 300, 250, 50}}));
  {
    const test_support::NewMemory images(photo.pixelCount());
    TypeParam(state).init("gtmOnly=true;");
    EXPECT_EQ(images.blocks(), 0);
  }
  const test_support::NewMemory images(photo.pixelCount());
  TypeParam filter(state);
  filter.init("gtmOnly=true;gtmExtraMemory=true;");
  EXPECT_EQ(images.blocks(), 2);
  EXPECT_TRUE(images.untouched());
}

TYPED_TEST(AutoEnhance, AppliesTheConfigurationItIsGivenAndPreparesByItsSessions) {
  const auto photo = photoLikePicture(60, 45, 11);
  // One field for the curve and one for the masks, which the slider leaves alone.
  FilterConfig other = defaultFilterConfigValue;
  other.histogramClipHigh = 1.1f;
  other.bilateralRange = 0.1f;
  const auto made = [&](const FilterConfig& ofSession, const FilterConfig& given) {
    TypeParam filter(stateOf(photo, {}, ofSession));
    filter.init("");
    Image<RGBA8Pixel> output(60, 45);
    filter.applyConfig("slider=0.6;", given, output);
    return fingerprint(output);
  };
  FilterConfig otherCurve = defaultFilterConfigValue, otherMasks = defaultFilterConfigValue;
  otherCurve.histogramClipHigh = other.histogramClipHigh;
  otherMasks.bilateralRange = other.bilateralRange;
  const std::string plain = made(defaultFilterConfigValue, defaultFilterConfigValue);
  EXPECT_EQ(made(defaultFilterConfigValue, other), made(defaultFilterConfigValue, otherCurve));
  EXPECT_EQ(made(other, defaultFilterConfigValue), made(otherMasks, defaultFilterConfigValue));
  EXPECT_NE(made(defaultFilterConfigValue, other), plain);
  EXPECT_NE(made(other, defaultFilterConfigValue), plain);
}

TYPED_TEST(AutoEnhance, FailsWithoutASliderAndLeavesTheOutput) {
  const auto photo = photoLikePicture(20, 20, 4);
  TypeParam filter(stateOf(photo));
  filter.init("");
  Image<RGBA8Pixel> output = flatPicture(20, 20, {1, 2, 3, 4});
  const std::string before = fingerprint(output);
  for (const char* params : {"", "Slider=0.4;", "gtmOnly=true;", ";;;", "=0.4"}) {
    EXPECT_THROW(filter.applyConfig(params, defaultFilterConfigValue, output), std::out_of_range)
        << params;
  }
  for (const char* params : {"slider=;", "slider=abc;", "slider=0.4abc;", "slider= 0.4;"}) {
    EXPECT_THROW(filter.applyConfig(params, defaultFilterConfigValue, output),
                 boost::bad_lexical_cast)
        << params;
  }
  EXPECT_EQ(fingerprint(output), before);
}

TYPED_TEST(AutoEnhance, GivesEqualOutputsToEqualCalls) {
  const auto photo = photoLikePicture(50, 40, 5);
  const std::string source = fingerprint(photo);
  TypeParam filter(stateOf(photo));
  filter.init("slider=0.4;");
  Image<RGBA8Pixel> first(50, 40), between(50, 40), second(50, 40);
  filter.applyConfig("slider=0.4;", defaultFilterConfigValue, first);
  filter.applyConfig("slider=0.9;", defaultFilterConfigValue, between);
  filter.applyConfig("slider=0.4", defaultFilterConfigValue, second);
  EXPECT_EQ(fingerprint(first), fingerprint(second));
  EXPECT_NE(fingerprint(first), fingerprint(between));
  EXPECT_EQ(fingerprint(photo), source);
}

TYPED_TEST(AutoEnhance, ReadsOnlyTheWordTrueForItsOptions) {
  const auto photo = photoLikePicture(40, 30, 6);
  EXPECT_EQ(fingerprint(this->enhanced(photo, "gtmOnly=1;", "slider=0.5;gtmOnly=1;")),
            fingerprint(this->enhanced(photo, "", "slider=0.5;")));
}

TYPED_TEST(AutoEnhance, HandsOutCopiesOfItsMasks) {
  const auto photo = photoLikePicture(40, 30, 7);
  TypeParam filter(stateOf(photo));
  filter.init("");
  const auto bilateral = filter.getBilateralMask();
  const std::string before = fingerprint(*bilateral);
  EXPECT_EQ(bilateral->width, 40u);
  EXPECT_EQ(bilateral->height, 30u);
  const auto ltm = filter.getLtmMask();
  const std::string ltmBefore = fingerprint(*ltm);
  EXPECT_NE(ltmBefore, before);
  bilateral->set(0.0f);
  ltm->set(0.0f);
  EXPECT_EQ(fingerprint(*filter.getBilateralMask()), before);
  EXPECT_EQ(fingerprint(*filter.getLtmMask()), ltmBefore);
}

TYPED_TEST(AutoEnhance, TakesEverySize) {
  for (const auto& [width, height] :
       {std::pair{0u, 0u}, {0u, 9u}, {1u, 1u}, {1u, 2u}, {3u, 1u}, {65500u, 1u}, {1u, 3000u}}) {
    const auto photo = noisePicture(width, height, 8);
    const auto output = this->enhanced(photo, "", "slider=0.7;");
    EXPECT_EQ(output.pixelCount(), photo.pixelCount());
    for (std::size_t i = 0; i < photo.pixelCount(); ++i) {
      ASSERT_EQ(output.data.get()[i].a, photo.data.get()[i].a);  // every pixel was written
    }
  }
}

/// The pass as it is defined, over the filter's own masks.
template <typename Filter>
Image<RGBA8Pixel> byDefinition(const Image<RGBA8Pixel>& photo, float slider) {
  Filter filter(stateOf(photo));
  filter.init("");
  ImageStatistics statistics;
  analyzeImage(photo, {}, statistics);
  FilterConfig config = defaultFilterConfigValue;
  updateFilterConfigForSliderValue(slider, &config);
  const TonePass pass(buildToneCurve(statistics, config), 100.0f, config.vibrance, config.ltmBlend,
                      config.detailGain);
  const auto bilateral = filter.getBilateralMask(), ltm = filter.getLtmMask();
  Image<RGBA8Pixel> output(photo.width, photo.height);
  enhanceRowScalar<float>(pass, photo.data.get(), bilateral->data.get(), ltm->data.get(),
                          output.data.get(), photo.pixelCount());
  return output;
}

TYPED_TEST(AutoEnhance, GivesDefinedBytesForAnySlider) {
  constexpr float infinity = std::numeric_limits<float>::infinity();
  struct Case {
    const char* slider;
    float value;
    const char *floatMasks, *byteMasks;
  };
  const char* const black = "70ae621d85b7c525";  // what NaN becomes
  const Case cases[] = {
      {"nan", std::nanf(""), black, black},
      {"inf", infinity, black, black},
      {"-inf", -infinity, black, black},
      {"1e30", 1e30f, "0c8ff9bc42e51df3", "02b3ee69e53221b8"},
      {"-1e30", -1e30f, "26fbaf41dc7e86b4", "37908f67019b05ae"},
      {"-0.3", -0.3f, "6f5ecbd8cd8d98db", "ba5433c2c7333f78"},
      {"17", 17.0f, "ebbcbe6f9feb9638", "dcb7754e2ed3c2f7"},
  };
  const auto photo = photoLikePicture(30, 20, 9);
  for (const Case& c : cases) {
    SCOPED_TRACE(c.slider);
    const auto output = this->enhanced(photo, "", std::string("slider=") + c.slider + ";");
    const bool bytes = std::is_same_v<TypeParam, AEFilter8bit>;
    EXPECT_EQ(fingerprint(output), bytes ? c.byteMasks : c.floatMasks);
    EXPECT_EQ(fingerprint(output), fingerprint(byDefinition<TypeParam>(photo, c.value)));
  }
}

TEST(AutoEnhance8bit, ReadsItsMasksAsByteOver255) {
  const auto photo = photoLikePicture(40, 30, 10);
  AEFilter8bit filter(stateOf(photo));
  filter.init("");
  for (const auto& mask : {filter.getBilateralMask(), filter.getLtmMask()}) {
    for (std::size_t i = 0; i < mask->pixelCount(); ++i) {
      const float byte = std::round(mask->data.get()[i] * 255.0f);
      ASSERT_EQ(mask->data.get()[i], byte / 255.0f);
    }
  }
}

}  // namespace
}  // namespace pelorin::image_processing
