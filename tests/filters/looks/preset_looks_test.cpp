#include "image_processing/filters/looks/preset_looks.h"

#include <gtest/gtest.h>

#include <map>
#include <memory>

#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/looks/soft_light.h"
#include "tests/support/fingerprint.h"
#include "tests/support/looks.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::applied;
using test_support::flatPicture;

template <typename Filter>
RGBA8Pixel withoutVignette(RGBA8Pixel pixel) {
  return *applied<Filter>(flatPicture(3, 3, pixel), "applyMask=0;").data;
}

TEST(PresetLooks, MapBlackToTheFirstSamplesWithoutVignette) {
  constexpr RGBA8Pixel black{0, 0, 0, 255};
  EXPECT_EQ(withoutVignette<WinterRGBFilter>(black), (RGBA8Pixel{22, 27, 32, 255}));
  EXPECT_EQ(withoutVignette<VintageRGBFilter>(black), (RGBA8Pixel{33, 33, 33, 255}));
  EXPECT_EQ(withoutVignette<FallRGBFilter>(black), (RGBA8Pixel{2, 2, 2, 255}));
  EXPECT_EQ(withoutVignette<SummerRGBFilter>(black), (RGBA8Pixel{2, 2, 2, 255}));
  EXPECT_EQ(withoutVignette<SpringRGBFilter>(black), (RGBA8Pixel{18, 9, 9, 255}));
  EXPECT_EQ(withoutVignette<ZebraBWFilter>(black), (RGBA8Pixel{0, 0, 0, 255}));
}

TEST(PresetLooks, MapWhiteToTheLastSamplesWithoutVignette) {
  constexpr RGBA8Pixel white{255, 255, 255, 255};
  EXPECT_EQ(withoutVignette<VintageRGBFilter>(white), (RGBA8Pixel{222, 224, 220, 255}));
  EXPECT_EQ(withoutVignette<WinterRGBFilter>(white), (RGBA8Pixel{255, 255, 250, 255}));
}

TEST(PresetLooks, HitTheSamplesAtMultiplesOfFive) {
  // In float 0.2 times some of these inputs falls just short of the sample's index.
  for (std::size_t i = 0; i < 52; ++i) {
    const std::uint8_t x = static_cast<std::uint8_t>(5 * i);
    const RGBA8Pixel out = withoutVignette<SummerRGBFilter>({x, x, x, 0});
    EXPECT_NEAR(out.r, summerCurves[0][i], 1.0) << i;
    EXPECT_NEAR(out.g, summerCurves[1][i], 1.0) << i;
    EXPECT_NEAR(out.b, summerCurves[2][i], 1.0) << i;
  }
}

TEST(PresetLooks, MakeSnowOfTheGreyAfterTheVignetteAlone) {
  // Exchanging green and blue mostly leaves the sum as it is. The radius keeps every pixel at the
  // mask's first sample.
  Image<RGBA8Pixel> picture = test_support::noisePicture(128, 64, 5);
  for (std::size_t i = 0; i < picture.pixelCount(); i += 2) {
    const RGBA8Pixel p = picture.data.get()[i];
    picture.data.get()[i + 1] = {p.r, p.b, p.g, p.a};
  }
  const float mask = test_support::maskOf<ZebraBWFilter>()(0.0f);
  for (const bool vignette : {false, true}) {
    const Image<RGBA8Pixel> output =
        applied<ZebraBWFilter>(picture, vignette ? "maskRadius=1000;" : "applyMask=0;");
    std::map<float, RGBA8Pixel> byGrey;
    int compared = 0;
    for (std::size_t i = 0; i < picture.pixelCount(); ++i) {
      const auto channel = [&](std::uint8_t value) {
        const float x = static_cast<float>(value);
        return vignette ? vignetteChannel(x, mask, ZebraBWFilter::maskAlpha) : x;
      };
      const RGBA8Pixel from = picture.data.get()[i];
      RGBA8Pixel to = output.data.get()[i];
      to.a = 0;
      const float grey = 0.8f * channel(from.r) + 0.1f * channel(from.g) + 0.1f * channel(from.b);
      const auto [entry, isNew] = byGrey.emplace(grey, to);
      EXPECT_EQ(entry->second, to) << grey;
      compared += !isNew;
    }
    EXPECT_GT(compared, 1000);
  }
}

TEST(PresetLooks, MixALittleOfEveryChannelIntoVintage) {
  const Rgb mixed = mixChannels(VintageRGBFilter::channelMix, {100.0f, 200.0f, 40.0f});
  EXPECT_FLOAT_EQ(mixed.r, 102.0f);
  EXPECT_FLOAT_EQ(mixed.g, 187.0f);
  EXPECT_FLOAT_EQ(mixed.b, 51.0f);
}

TEST(PresetLooks, FeedEachChannelToItsOwnCurveOtherwise) {
  for (const ChannelMix mix : {WinterRGBFilter::channelMix, SpringRGBFilter::channelMix,
                               FallRGBFilter::channelMix, SummerRGBFilter::channelMix}) {
    EXPECT_EQ(mix, ChannelMix::none);
  }
}

TEST(PresetLooks, TakeACurveFromTheParametersForOneApplication) {
  const Image<RGBA8Pixel> picture = test_support::photoLikePicture(30, 20, 1);
  FallRGBFilter filter(test_support::stateOf(picture));
  filter.init("");
  const Image<RGBA8Pixel> preset = applied(filter, 30, 20, "");
  const Image<RGBA8Pixel> replaced = applied(filter, 30, 20, "g=0,1,;");
  EXPECT_NE(test_support::fingerprint(replaced), test_support::fingerprint(preset));
  EXPECT_EQ(test_support::fingerprint(applied(filter, 30, 20, "")),
            test_support::fingerprint(preset));
}

struct Settings {
  float edge, centre, maskRadius, maskAlpha;
  bool applyMask;
  friend bool operator==(const Settings&, const Settings&) = default;
};

template <typename Filter>
Settings settingsOf() {
  Settings s;
  Filter(nullptr).getRadialMaskParameters(s.edge, s.centre, s.maskRadius, s.maskAlpha, s.applyMask);
  return s;
}

TEST(PresetLooks, HaveTheirVignetteSettings) {
  const float edge = 0.08627451f, centre = 0.6392157f;
  EXPECT_EQ(settingsOf<ZebraBWFilter>(), (Settings{edge, centre, 2.28f, 1.0f, true}));
  EXPECT_EQ(settingsOf<WinterRGBFilter>(), (Settings{edge, centre, 2.28f, 0.3f, true}));
  EXPECT_EQ(settingsOf<SpringRGBFilter>(), (Settings{edge, centre, 2.28f, 0.3f, true}));
  EXPECT_EQ(settingsOf<FallRGBFilter>(), (Settings{edge, centre, 2.28f, 0.3f, true}));
  EXPECT_EQ(settingsOf<SummerRGBFilter>(), (Settings{edge, centre, 2.3f, 1.0f, true}));
  EXPECT_EQ(settingsOf<VintageRGBFilter>(), (Settings{edge, centre, 2.28f, 1.0f, true}));
}

std::string fingerprintOf(const std::string& name, const std::string& params,
                          const Image<RGBA8Pixel>& picture) {
  auto state = test_support::stateOf(picture);
  const auto filter = DefaultFilterFactory::filterFactory()->find(name)->makeFilter(state);
  filter->init(params);
  return test_support::fingerprint(applied(*filter, picture.width, picture.height, params));
}

TEST(Looks, HaveTheirGoldenFingerprints) {
  const Image<RGBA8Pixel> photo = test_support::photoLikePicture(500, 333, 11);
  const Image<RGBA8Pixel> noise = test_support::noisePicture(97, 61, 12);
  struct Golden {
    const char *name, *params, *ofPhoto, *ofNoise;
  };
  constexpr const char* starFish = "s1=0.9;s2=0.2;s3=0.35;s4=0.8;";
  constexpr const char* maskedStarFish = "s1=0.9;s2=0.2;s3=0.35;s4=0.8;applyMask=1;";
  const std::vector<Golden> goldens = {
      {"ZebraBW", "", "51d238bce35f29a4", "44e6d0b7c7ad94fc"},
      {"ZebraBW", "applyMask=0;", "4e759d5ad6f4f754", "4db1a17276023c9a"},
      {"SummerRGB", "", "8a5dcf0be092d532", "f6462fc205b6b474"},
      {"SummerRGB", "applyMask=0;", "dfa62a4cb6e013ef", "5dd4ab3e8e03496d"},
      {"SpringRGB", "", "ab2b6c0a9bf7c1d2", "a4409449a3ae37bd"},
      {"SpringRGB", "applyMask=0;", "9e8dcc151d56278d", "2645a7a54d5ca949"},
      {"FallRGB", "", "e1ec88fe50447018", "ba33fa79a5a47b05"},
      {"FallRGB", "applyMask=0;", "39167a6e6fb552d0", "8b39a24eb45c0de1"},
      {"VintageRGB", "", "c4d1c12640aff971", "3a0a65f94533dbd3"},
      {"VintageRGB", "applyMask=0;", "539b82a2862288f0", "e45cac5190efd3d6"},
      {"WinterRGB", "", "d0977595f53dea9c", "df8ae46ea2c7621d"},
      {"WinterRGB", "applyMask=0;", "0342b67984deda09", "375d1796d21ae2ef"},
      {"LowDimRGBCurve", starFish, "4d07a4776a88c380", "d696f939a5ecba5d"},
      {"LowDimRGBCurve", maskedStarFish, "cfc8ad5062778fd6", "8b0802542cc54d96"},
  };
  for (const Golden& golden : goldens) {
    EXPECT_EQ(fingerprintOf(golden.name, golden.params, photo), golden.ofPhoto)
        << golden.name << " " << golden.params;
    EXPECT_EQ(fingerprintOf(golden.name, golden.params, noise), golden.ofNoise)
        << golden.name << " " << golden.params;
  }
}

}  // namespace
}  // namespace pelorin::image_processing
