#include "image_processing/quality/niqe.h"

#include <gtest/gtest.h>

#include <cmath>

#include "image_processing/quality/niqe_features.h"
#include "image_processing/quality/niqe_model.h"
#include "image_processing/quality/quality_score.h"
#include "tests/quality/float_images.h"
#include "tests/quality/natural_pictures.h"
#include "tests/support/fingerprint.h"
#include "tests/support/instruction_sets.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::fingerprint;
using test_support::flatPicture;
using test_support::noisePicture;
using test_support::photoLikePicture;
using test_support::sameBytes;

bool sameFeatures(const Image<float>& a, const Image<float>& b) {
  return a.width == b.width && a.height == b.height &&
         sameBytes(a.data.get(), b.data.get(), a.pixelCount());
}

TEST(Niqe, OfNinetySixByNinetySixIsOneBlockAtEachScale) {
  const Image<float> features = niqeFeatures(photoLikePicture(96, 96, 1));
  EXPECT_EQ(features.width, 1u);
  EXPECT_EQ(features.height, 36u);
  EXPECT_FALSE(std::isnan(*features.row(0)));
  EXPECT_FALSE(std::isnan(*features.row(18)));
}

TEST(Niqe, IgnoresPixelsBeyondTheBlocksExceptBesideThem) {
  // 2 x 1 blocks end at column 192 and row 96; features look six pixels further.
  const Image<float> features = niqeFeatures(photoLikePicture(200, 100, 2));
  EXPECT_EQ(features.width, 2u);

  Image<RGBA8Pixel> farAway = photoLikePicture(200, 100, 2);
  for (std::uint32_t y = 0; y < 100; ++y)
    for (std::uint32_t x = 198; x < 200; ++x) farAway.row(y)[x] = {255, 0, 255, 0};
  EXPECT_TRUE(sameFeatures(niqeFeatures(farAway), features));

  Image<RGBA8Pixel> beside = photoLikePicture(200, 100, 2);
  for (std::uint32_t y = 0; y < 100; ++y) beside.row(y)[192] = {255, 0, 255, 0};
  EXPECT_FALSE(sameFeatures(niqeFeatures(beside), features));
  Image<RGBA8Pixel> below = photoLikePicture(200, 100, 2);
  for (std::uint32_t x = 0; x < 200; ++x) below.row(96)[x] = {255, 0, 255, 0};
  EXPECT_FALSE(sameFeatures(niqeFeatures(below), features));
}

TEST(Niqe, OfAFlatPictureIsTheNormOfTheModelMean) {
  for (const std::uint8_t grey : {0, 1, 77, 128, 255}) {
    Image<RGBA8Pixel> picture = flatPicture(130, 100, {grey, grey, grey, 255});
    const Image<float> features = niqeFeatures(picture);
    for (std::size_t i = 0; i < features.pixelCount(); ++i)
      ASSERT_TRUE(std::isnan(features.data.get()[i]));
    EXPECT_NEAR(niqeMetric(picture), 28.59388f, 5e-5f);
    EXPECT_EQ(niqeMetric(picture), 28.5938492f);
    EXPECT_EQ(niqeMetric(picture), computeQuality(std::vector<float>(36, 0.0f)));
  }
}

TEST(Niqe, OfATooSmallPictureIsNanAndReadsNothing) {
  // Pixels nobody may touch.
  const std::shared_ptr<RGBA8Pixel> forbidden(std::shared_ptr<void>(),
                                              reinterpret_cast<RGBA8Pixel*>(16));
  for (const auto& [width, height] :
       {std::pair{0u, 0u}, {95u, 96u}, {96u, 95u}, {1u, 400000000u}, {4000000u, 95u}}) {
    Image<RGBA8Pixel> picture(width, height, forbidden);
    EXPECT_TRUE(std::isnan(niqeMetric(picture)));
    const NiqeAnalysis analysis = analyzeNiqe(picture);
    EXPECT_TRUE(std::isnan(analysis.score));
    EXPECT_EQ(analysis.blockColumns, 0u);
    EXPECT_EQ(analysis.blockRows, 0u);
    EXPECT_EQ(analysis.blockFeatures.width, 0u);
    EXPECT_EQ(analysis.blockFeatures.height, 0u);
    EXPECT_TRUE(analysis.meanFeatures.empty());
    EXPECT_TRUE(analysis.blockDistances.empty());
  }
}

TEST(Niqe, IgnoresAlpha) {
  Image<RGBA8Pixel> picture = photoLikePicture(192, 96, 3);
  const float score = niqeMetric(picture);
  for (std::size_t i = 0; i < picture.pixelCount(); ++i) picture.data.get()[i].a = 17;
  EXPECT_EQ(niqeMetric(picture), score);
}

TEST(Niqe, LeavesThePictureAlone) {
  Image<RGBA8Pixel> picture = photoLikePicture(192, 96, 4);
  const std::string before = fingerprint(picture);
  niqeMetric(picture);
  EXPECT_EQ(fingerprint(picture), before);
}

TEST(Niqe, KeepsItsFeaturesAndScores) {
  struct Golden {
    Image<RGBA8Pixel> picture;
    const char* features;
    float score;
  };
  const Golden goldens[] = {
      {photoLikePicture(96, 96, 1), "2b0111be2eb6c475", 10.7279482f},
      {photoLikePicture(331, 299, 3), "9df4b055f6082614", 16.3990269f},
      {photoLikePicture(97, 193, 2), "b883b060bf11213d", 11.6780672f},
      {noisePicture(200, 100, 6), "bf64756eac339ce2", 35.4246597f},
  };
  for (const Golden& golden : goldens) {
    Image<RGBA8Pixel> picture = golden.picture;
    const Image<float> features = niqeFeaturesScalar(picture);
    // All pictures have every feature: a NaN's bytes are nobody's promise.
    for (std::size_t i = 0; i < features.pixelCount(); ++i)
      ASSERT_FALSE(std::isnan(features.data.get()[i]));
    EXPECT_EQ(fingerprint(features), golden.features);
    EXPECT_EQ(niqeMetric(picture), golden.score) << picture.width << " x " << picture.height;
  }
}

TEST(Niqe, FeaturesMatchTheirDefinitionByteForByteOnEveryInstructionSet) {
  const Image<RGBA8Pixel> pictures[] = {
      photoLikePicture(96, 96, 1),   photoLikePicture(97, 193, 2),
      photoLikePicture(200, 100, 3), photoLikePicture(331, 299, 4),
      photoLikePicture(102, 389, 5), noisePicture(1730, 97, 6),
      noisePicture(203, 294, 7),     flatPicture(192, 192, {9, 99, 199, 255})};
  for (const Image<RGBA8Pixel>& picture : pictures) {
    const Image<float> expected = niqeFeaturesScalar(picture);
    test_support::onEveryInstructionSet([&] {
      EXPECT_TRUE(sameFeatures(niqeFeatures(picture), expected))
          << picture.width << " x " << picture.height;
    });
  }
}

/// Rows that stand nowhere before they are asked for.
class ComingRows : public RowSource {
 public:
  explicit ComingRows(const Image<RGBA8Pixel>& picture) : picture_(picture) {}
  const RGBA8Pixel* next(std::uint32_t count, RGBA8Pixel* room) override {
    std::copy_n(picture_.row(read_), std::size_t{picture_.width} * count, room);
    read_ += count;
    return room;
  }
  bool allRead() const { return read_ == picture_.height; }

 private:
  const Image<RGBA8Pixel>& picture_;
  std::uint32_t read_ = 0;
};

TEST(NiqeAnalysis, IsTheSameOfRowsThatComeAndReadsThemAll) {
  for (const std::uint32_t height : {95u, 96u, 101u, 102u, 103u, 191u, 192u, 198u, 300u, 389u}) {
    const Image<RGBA8Pixel> picture = photoLikePicture(113, height, height);
    ComingRows rows(picture);
    const NiqeAnalysis analysis = analyzeNiqe(picture.width, height, rows);
    EXPECT_TRUE(rows.allRead()) << height;
    EXPECT_TRUE(sameFeatures(analysis.blockFeatures, analyzeNiqe(picture).blockFeatures)) << height;
  }
}

TEST(NiqeAnalysis, TellsWhatTheScoreIsMadeOf) {
  Image<RGBA8Pixel> picture = photoLikePicture(310, 205, 5);
  const NiqeAnalysis analysis = analyzeNiqe(picture);
  EXPECT_EQ(analysis.score, niqeMetric(picture));
  EXPECT_EQ(analysis.blockColumns, 3u);
  EXPECT_EQ(analysis.blockRows, 2u);
  EXPECT_TRUE(sameFeatures(analysis.blockFeatures, niqeFeatures(picture)));
  ASSERT_EQ(analysis.meanFeatures.size(), 36u);
  EXPECT_EQ(computeQuality(analysis.meanFeatures), analysis.score);
  ASSERT_EQ(analysis.blockDistances.size(), 6u);
}

TEST(NiqeAnalysis, DistanceOfTheOnlyBlockIsTheScore) {
  const NiqeAnalysis analysis = analyzeNiqe(photoLikePicture(100, 120, 6));
  ASSERT_EQ(analysis.blockDistances.size(), 1u);
  EXPECT_EQ(analysis.blockDistances[0], analysis.score);
}

TEST(NiqeAnalysis, ShowsWhereAPictureIsFlat) {
  Image<RGBA8Pixel> picture = toPicture(test_support::naturalPlane(384, 192, 1));
  for (std::uint32_t y = 0; y < 102; ++y)
    std::fill_n(picture.row(y) + 90, 108, RGBA8Pixel{60, 60, 60, 255});
  const std::vector<float> distances = analyzeNiqe(picture).blockDistances;
  for (std::size_t k = 0; k < distances.size(); ++k) {
    if (k == 1) {
      EXPECT_NEAR(distances[k], 28.59388f, 1e-4f);
    } else {
      EXPECT_LT(distances[k], 15.0f) << k;
    }
  }
}

class NiqeOrder : public testing::TestWithParam<std::uint64_t> {
 protected:
  static float scoreOf(const test_support::GreyPlane& plane) {
    Image<RGBA8Pixel> picture = toPicture(plane);
    return niqeMetric(picture);
  }

  const test_support::GreyPlane source_ = test_support::naturalPlane(288, 192, GetParam());
  const float natural_ = scoreOf(source_);
};

TEST_P(NiqeOrder, ANaturalPictureScoresWell) {
  EXPECT_LT(natural_, 4.0f);
}

TEST_P(NiqeOrder, MoreBlurScoresWorse) {
  const float slight = scoreOf(blurred(source_, 1.5f)), strong = scoreOf(blurred(source_, 4.0f));
  EXPECT_GT(slight, natural_ + 1.0f);
  EXPECT_GT(strong, slight + 1.0f);
}

TEST_P(NiqeOrder, MoreNoiseScoresWorse) {
  const float slight = scoreOf(noisy(source_, 15.0f, 9)),
              strong = scoreOf(noisy(source_, 50.0f, 9));
  EXPECT_GT(slight, natural_ + 1.0f);
  EXPECT_GT(strong, slight + 1.0f);
}

TEST_P(NiqeOrder, MoreCompressionScoresWorse) {
  const float slight = scoreOf(compressed(source_, 10.0f));
  const float strong = scoreOf(compressed(source_, 40.0f));
  EXPECT_GT(slight, natural_ + 1.0f);
  EXPECT_GT(strong, slight + 1.0f);
}

INSTANTIATE_TEST_SUITE_P(Seeds, NiqeOrder, testing::Values(1, 2, 3));

}  // namespace
}  // namespace pelorin::image_processing
