#include "image_processing/autoenhance/lightness/build_tone_curve.h"

#include <gtest/gtest.h>

#include <vector>

#include "tests/support/curves.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::darkCurve;

TEST(BuildToneCurve, IsTheIdentityAtSliderZeroAndStaysItThroughTheMassage) {
  ImageStatistics statistics;
  statistics.cdf = darkCurve();
  FilterConfig config = defaultFilterConfigValue;
  updateFilterConfigForSliderValue(0.0f, &config);
  const std::vector<float> curve = buildToneCurve(statistics, config);
  for (int i = 0; i < 51; ++i) EXPECT_NEAR(curve[i], i / 50.0f, 2e-6f) << i;
}

TEST(BuildToneCurve, LiftsDarkFacesToTheirTarget) {
  ImageStatistics statistics;
  for (int i = 0; i < 51; ++i) statistics.cdf.push_back(static_cast<float>(i) / 50.0f);
  FilterConfig config = defaultFilterConfigValue;
  config.faceTarget = 0.15f;
  EXPECT_NEAR(buildToneCurve(statistics, config)[2], 0.04f, 1e-5f);
  statistics.faceMedianBin = 2;
  EXPECT_NEAR(buildToneCurve(statistics, config)[2], 0.15f, 0.02f);
  config.faceTarget = 0.0f;
  EXPECT_NEAR(buildToneCurve(statistics, config)[2], 0.04f, 1e-5f);
}

TEST(BuildToneCurve, NeverDecreasesAndRunsFromZeroToOne) {
  for (int seed = 0; seed < 4; ++seed) {
    ImageStatistics statistics;
    analyzeImage(test_support::photoLikePicture(80, 60, seed), {}, statistics);
    for (const float slider : {0.0f, 0.2f, 0.5f, 1.0f}) {
      FilterConfig config = defaultFilterConfigValue;
      updateFilterConfigForSliderValue(slider, &config);
      const std::vector<float> curve = buildToneCurve(statistics, config);
      EXPECT_EQ(curve.front(), 0.0f);
      EXPECT_NEAR(curve.back(), 1.0f, 1e-5f);
      for (int i = 1; i < 51; ++i) EXPECT_GE(curve[i], curve[i - 1]);
    }
  }
}

}  // namespace
}  // namespace pelorin::image_processing
