#include "image_processing/dupe/dupe_score.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <vector>

#include "image_processing/dupe/cdf_distance.h"
#include "tests/support/green_cdf.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::flatPicture;
using test_support::photoLikePicture;

constexpr float infinity = std::numeric_limits<float>::infinity();

float score(const Image<RGBA8Pixel>& a, const Image<RGBA8Pixel>& b, float dt, bool same) {
  return dupeStatisticTimeOrientationExposureInvariantKS(a, b, dt, same);
}

float distance(const Image<RGBA8Pixel>& a, const Image<RGBA8Pixel>& b) {
  return exposureInvariantCDFDistance(test_support::cdfOf(a), test_support::cdfOf(b));
}

float sumOfTerms(float distance, float logTime, bool same) {
  float sum = (same ? 1.0f : 0.0f) * 1.3892856f;
  sum = sum + logTime * -1.0713097f;
  sum = sum + distance * -6.9303436f;
  return sum + 0.87882f;
}

// C libraries round the logarithm differently: it may be off by one unit in the last place.
TEST(DupeScore, IsTheSumOfItsTermsInOrder) {
  for (const float dt : {0.0f, 0.01f, 0.95f, 1.0f, 3.7f, -60.0f, 86400.0f, 1e9f}) {
    for (const float distance : {0.0f, 0.00123f, 0.3f, 1.0f}) {
      for (const bool same : {false, true}) {
        const float logTime =
            static_cast<float>(std::log10(static_cast<double>(std::fabs(dt) + 0.05f)));
        EXPECT_THAT(
            (std::vector<float>{sumOfTerms(distance, std::nextafterf(logTime, -infinity), same),
                                sumOfTerms(distance, logTime, same),
                                sumOfTerms(distance, std::nextafterf(logTime, infinity), same)}),
            testing::Contains(dupeScoreOfDistance(distance, dt, same)))
            << dt << ' ' << distance << ' ' << same;
      }
    }
  }
}

TEST(DupeScore, TakesTheLogarithmOfTheOffsetWhenThereIsNoTimeDifference) {
  // log10(0.05)
  EXPECT_FLOAT_EQ(dupeScoreOfDistance(0.0f, 0.0f, false), 0.87882f - 1.0713097f * -1.30103f);
  EXPECT_FLOAT_EQ(dupeScoreOfDistance(0.0f, 0.0f, true), 3.6619117f);
}

TEST(DupeScore, DoesNotMindTheSignOfTheTimeDifference) {
  for (const float dt : {0.0f, 0.3f, 20.0f, infinity}) {
    EXPECT_EQ(dupeScoreOfDistance(0.2f, dt, true), dupeScoreOfDistance(0.2f, -dt, true));
  }
}

TEST(DupeScore, OfTheSamePhotoDependsOnTimeAndOrientationAlone) {
  // Up to the small distance a photo has to itself.
  const Image<RGBA8Pixel> photo = photoLikePicture(320, 240, 1);
  const float toItself = distance(photo, photo);
  EXPECT_NEAR(toItself, 0.0f, 0.005f);
  for (const float dt : {0.0f, 5.0f, 100.0f}) {
    for (const bool same : {false, true}) {
      EXPECT_EQ(score(photo, photo, dt, same), dupeScoreOfDistance(toItself, dt, same));
    }
  }
  EXPECT_NEAR(score(photo, photo, 0.0f, true), 3.6619f, 0.03f);
}

TEST(DupeScore, OfAnAllBlackPictureAndItselfCountsTheFullDistance) {
  const Image<RGBA8Pixel> black = flatPicture(10, 10, {0, 0, 0, 255});
  EXPECT_FLOAT_EQ(score(black, black, 0.0f, true), 3.6619117f - 6.9303436f);
}

TEST(DupeScore, OfEmptyImagesIsANumber) {
  const Image<RGBA8Pixel> empty(0, 0), photo = photoLikePicture(32, 24, 1);
  EXPECT_TRUE(std::isfinite(score(empty, empty, 1.0f, true)));
  EXPECT_TRUE(std::isfinite(score(empty, photo, 1.0f, true)));
  EXPECT_TRUE(std::isfinite(score(photo, empty, 1.0f, true)));
}

TEST(DupeScore, IsNaNForATimeThatIsNone) {
  EXPECT_TRUE(std::isnan(dupeScoreOfDistance(0.1f, std::nanf(""), true)));
  EXPECT_EQ(dupeScoreOfDistance(0.1f, infinity, true), -infinity);
}

TEST(DupeScore, IsTheSameFromDistributionsAsFromImages) {
  const Image<RGBA8Pixel> a = photoLikePicture(320, 240, 1), b = photoLikePicture(240, 320, 2);
  GreenCDF cdfA, cdfB;
  computeGreenCDF(a, cdfA);
  computeGreenCDF(b, cdfB);
  EXPECT_EQ(dupeScoreOfCDFs(cdfA, cdfB, 12.5f, true), score(a, b, 12.5f, true));
}

TEST(DupeScore, DropsFromAlikeToUnlike) {
  const Image<RGBA8Pixel> scene = photoLikePicture(320, 240, 1);
  Image<RGBA8Pixel> darker(320, 240);
  for (std::size_t i = 0; i < scene.pixelCount(); ++i) {
    darker.data.get()[i].g = static_cast<std::uint8_t>(scene.data.get()[i].g * 3 / 4);
  }
  EXPECT_GT(score(scene, darker, 1.0f, true), 1.5f);
  EXPECT_LT(score(scene, flatPicture(320, 240, {9, 128, 9, 255}), 1.0f, true), 0.0f);
  EXPECT_LT(score(scene, darker, 86400.0f, false), 0.0f);
}

TEST(DupeScore, HasTheRecordedValues) {
  const Image<RGBA8Pixel> a = photoLikePicture(320, 240, 11), b = photoLikePicture(320, 240, 12);
  EXPECT_FLOAT_EQ(score(a, a, 0.0f, true), 3.6583834f);
  EXPECT_FLOAT_EQ(score(a, b, 0.0f, true), 2.9996142f);
  EXPECT_FLOAT_EQ(score(a, b, 30.5f, false), -1.3743842f);
  EXPECT_FLOAT_EQ(score(b, a, -30.5f, false), -1.3743842f);
}

TEST(LongestDupeTimeDifference, IsThatOfTheDefaultThreshold) {
  EXPECT_NEAR(longestDupeTimeDifference(0.0f, true), 130.9, 0.05);
  EXPECT_NEAR(longestDupeTimeDifference(0.0f, false), 6.56, 0.005);
}

TEST(LongestDupeTimeDifference, HidesNoPairAndIsHardlyLongerThanNeeded) {
  for (float threshold = -30.0f; threshold < 3.6f; threshold += 0.0137f) {
    for (const bool same : {false, true}) {
      const double longest = longestDupeTimeDifference(threshold, same);
      if (longest < 0.0) {
        EXPECT_LT(dupeScoreOfDistance(0.0f, 0.0f, same), threshold);
        continue;
      }
      const float beyond = std::nextafterf(static_cast<float>(longest), infinity);
      EXPECT_LT(dupeScoreOfDistance(0.0f, beyond, same), threshold) << threshold;
      const float within = static_cast<float>((longest + 0.05) * 0.999 - 0.05);
      if (within >= 0.0f) {
        EXPECT_GE(dupeScoreOfDistance(0.0f, within, same), threshold) << threshold;
      }
    }
  }
}

TEST(LongestDupeTimeDifference, IsNegativeWhereNothingReachesTheThreshold) {
  EXPECT_LT(longestDupeTimeDifference(3.7f, true), 0.0);
  EXPECT_LT(longestDupeTimeDifference(infinity, true), 0.0);
  EXPECT_GE(longestDupeTimeDifference(3.66f, true), 0.0);
  EXPECT_LT(longestDupeTimeDifference(3.66f, false), 0.0);
}

TEST(LongestDupeTimeDifference, IsInfiniteWhereEveryPairReachesTheThreshold) {
  EXPECT_EQ(longestDupeTimeDifference(-infinity, false), std::numeric_limits<double>::infinity());
  EXPECT_GT(longestDupeTimeDifference(-1000.0f, false), 1e300);
}

}  // namespace
}  // namespace pelorin::image_processing
