#include "image_processing/quality/quality_score.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>

#include "image_processing/quality/niqe.h"
#include "image_processing/quality/niqe_model.h"
#include "tests/support/fingerprint.h"

namespace pelorin::image_processing {
namespace {

std::vector<float> modelMean() {
  return {niqeModelMean.begin(), niqeModelMean.end()};
}

// Where row i of the packed triangle starts.
std::size_t packedRow(std::size_t i) {
  return i * niqeFeatureCount - i * (i - 1) / 2;
}

TEST(NiqeModel, KeepsEveryBit) {
  EXPECT_EQ(test_support::fingerprint(niqeModelMean.data(), sizeof niqeModelMean),
            "6387c759181ddb07");
  EXPECT_EQ(test_support::fingerprint(niqeModelPrecision.data(), sizeof niqeModelPrecision),
            "7b13ce0feea144cb");
  // Other values are another model.
  EXPECT_STREQ(niqeModelId, "niqe-pristine-1");
}

TEST(NiqeModel, HoldsTheValuesKnownFromElsewhere) {
  const float firstRow[] = {42.730076f, 8.5956964f,  -79.744431f, 169.41724f,
                            162.43539f, -109.67567f, -135.88596f, 189.99802f};
  for (std::size_t i = 0; i < 8; ++i) EXPECT_EQ(niqeModelPrecision[i], firstRow[i]);
  EXPECT_EQ(niqeModelPrecision[packedRow(1)], 1062.8918f);
  EXPECT_EQ(niqeModelPrecision[packedRow(2)], 11951.229f);
  EXPECT_EQ(niqeModelPrecision[packedRow(18)], 9.0650406f);
  EXPECT_EQ(niqeModelPrecision[packedRow(34) + 1], 2522.4285f);
  EXPECT_EQ(niqeModelPrecision[packedRow(35)], 22061.992f);
  EXPECT_EQ(packedRow(35) + 1, niqeModelPrecision.size());
}

TEST(NiqeModel, IsPositiveDefinite) {
  // By Cholesky's decomposition: no features, then, have a negative square of a distance.
  double lower[niqeFeatureCount][niqeFeatureCount] = {};
  for (std::size_t i = 0; i < niqeFeatureCount; ++i) {
    for (std::size_t j = 0; j <= i; ++j) {
      double rest = niqeModelPrecision[packedRow(j) + i - j];
      for (std::size_t k = 0; k < j; ++k) rest -= lower[i][k] * lower[j][k];
      if (i == j) {
        ASSERT_GT(rest, 0.0) << i;
      }
      lower[i][j] = i == j ? std::sqrt(rest) : rest / lower[j][j];
    }
  }
}

TEST(Mean, SkipsNanAndReplacesWhatWasThere) {
  Image<float> features(3, 2);
  const float values[] = {1.0f, NAN, 4.0f, NAN, NAN, NAN};
  std::copy_n(values, 6, features.data.get());
  std::vector<float> means = {9.0f, 9.0f, 9.0f};
  mean(features, means);
  EXPECT_EQ(means, (std::vector<float>{2.5f, 0.0f}));
}

TEST(Mean, AddsFromLeftToRight) {
  Image<float> features(3, 1);
  const float values[] = {1e8f, -1e8f, 3.0f};
  std::copy_n(values, 3, features.data.get());
  std::vector<float> means;
  mean(features, means);
  EXPECT_EQ(means, std::vector<float>{1.0f});
}

TEST(ComputeQuality, OfTheModelMeanIsZero) {
  EXPECT_EQ(computeQuality(modelMean()), 0.0f);
}

TEST(ComputeQuality, OfOneFeatureOffIsItsDifferenceTimesTheRootOfTheDiagonal) {
  for (std::size_t i = 0; i < niqeFeatureCount; ++i) {
    std::vector<float> features = modelMean();
    features[i] += 0.5f;
    EXPECT_NEAR(computeQuality(features) / (0.5f * std::sqrt(niqeModelPrecision[packedRow(i)])),
                1.0f, 1e-5f);
  }
}

TEST(ComputeQuality, CountsThePartsOffTheDiagonalOnBothSides) {
  std::vector<float> features = modelMean();
  features[3] -= 1.0f;
  features[7] -= 1.0f;
  const double form = double{niqeModelPrecision[packedRow(3)]} +
                      2.0 * niqeModelPrecision[packedRow(3) + 4] + niqeModelPrecision[packedRow(7)];
  EXPECT_NEAR(computeQuality(features), std::sqrt(form), 1e-3);
}

TEST(ComputeQuality, NeedsThirtySixFeatures) {
  EXPECT_TRUE(std::isnan(computeQuality({})));
  EXPECT_TRUE(std::isnan(computeQuality(std::vector<float>(35))));
  EXPECT_TRUE(std::isnan(computeQuality(std::vector<float>(37))));
}

}  // namespace
}  // namespace pelorin::image_processing
