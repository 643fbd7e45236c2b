#include "image_processing/autoenhance/lightness/image_statistics.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <vector>

#include "image_processing/autoenhance/colour/lab.h"
#include "image_processing/autoenhance/photo_analysis.h"
#include "tests/support/faces.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::flatPicture;
using test_support::photoLikePicture;
using test_support::withFaces;

ImageStatistics statisticsOf(const Image<RGBA8Pixel>& image, const ImageMetadata& metadata = {}) {
  ImageStatistics statistics;
  analyzeImage(image, metadata, statistics);
  return statistics;
}

TEST(ImageStatistics, HaveNoFaceMedianWithoutFacePixels) {
  EXPECT_EQ(ImageStatistics().faceMedianBin, -1);
  const auto photo = photoLikePicture(40, 30, 1);
  EXPECT_EQ(statisticsOf(photo).faceMedianBin, -1);
  EXPECT_EQ(statisticsOf(photo, withFaces({{100, 120, 90, 80}})).faceMedianBin, -1);  // outside
  EXPECT_EQ(statisticsOf(photo, withFaces({{20, 10, 20, 10}})).faceMedianBin, -1);    // reversed
  EXPECT_EQ(statisticsOf(photo, withFaces({{-9, -1, 10, -10}})).faceMedianBin, -1);   // left of it
  EXPECT_EQ(statisticsOf(photo, withFaces({{5, 10, -5, -1}})).faceMedianBin, -1);     // reversed
  // One pixel is enough.
  EXPECT_EQ(
      statisticsOf(flatPicture(40, 30, {0, 0, 0, 255}), withFaces({{7, 7, 9, 9}})).faceMedianBin,
      1);
}

TEST(ImageStatistics, AreGivenUpBetweenTheBandsOfEveryPart) {
  struct OneByOne : Workers {
    std::size_t count() const override { return 3; }
    void run(std::size_t tasks, const Task& task) override {
      for (std::size_t i = 0; i < tasks; ++i) task(i);
    }
  } workers;
  const auto photo = photoLikePicture(8, 50, 1);
  const ImageMetadata none;
  int asked = 0, last = -1;
  const auto analysed = [&] {
    asked = 0;
    return analysePhoto({8, 50, none}, photo.data.get(), &workers, 10,
                        [&] { return ++asked == last; });
  };
  ASSERT_TRUE(analysed());
  EXPECT_EQ(analysed()->cdf, statisticsOf(photo).cdf);
  EXPECT_EQ(asked, 6);  // 16 rows and twice 17
  for (last = 1; last <= 6; ++last) {
    EXPECT_FALSE(analysed());
    EXPECT_EQ(asked, last);
  }
}

TEST(ImageStatistics, OfAnAllBlackImageFillTheFirstBin) {
  const ImageStatistics statistics = statisticsOf(flatPicture(9, 5, {0, 0, 0, 255}));
  ASSERT_EQ(statistics.cdf.size(), 51u);
  EXPECT_EQ(statistics.cdf[0], 0.0f);
  for (std::size_t i = 1; i < 51; ++i) EXPECT_NEAR(statistics.cdf[i], 1.0f, 1e-6f) << i;
}

TEST(ImageStatistics, OfPureWhiteFillTheLastBinAlone) {
  const ImageStatistics statistics = statisticsOf(flatPicture(8, 8, {255, 255, 255, 255}));
  for (std::size_t i = 0; i < 50; ++i) EXPECT_EQ(statistics.cdf[i], 0.0f) << i;
  EXPECT_EQ(statistics.cdf[50], 1.0f);
}

TEST(ImageStatistics, ReportAMedianInTheLastEntryAsNone) {
  EXPECT_EQ(statisticsOf(flatPicture(8, 8, {255, 255, 255, 255}), withFaces({{0, 7, 7, 0}}))
                .faceMedianBin,
            -1);
}

TEST(ImageStatistics, FindTheMedianWhereTheCdfReachesOneHalf) {
  // One dark and one bright pixel: the CDF is exactly one half behind the dark one's bin.
  Image<RGBA8Pixel> two(2, 1);
  two.row(0)[0] = {20, 20, 20, 255};
  two.row(0)[1] = {200, 200, 200, 255};
  const auto behind = [](int code) {
    return static_cast<int>(49.0f * rgbToLab(code, code, code).L / 100.0f) + 1;
  };
  ASSERT_LT(behind(20), behind(200));
  EXPECT_EQ(statisticsOf(two, withFaces({{0, 1, 0, 0}})).faceMedianBin, behind(20));
}

TEST(ImageStatistics, AreTheSameHoweverTheyAreAskedFor) {
  for (std::uint64_t seed = 0; seed < 3; ++seed) {
    const auto photo = photoLikePicture(90, 70, seed);
    const ImageMetadata metadata = withFaces({{20, 50, 60, 10}, {-5, 8, 90, 40}});
    const ImageStatistics expected = statisticsOf(photo, metadata);
    ImageStatistics statistics;
    computeImageStatistics(photo, metadata, 50, 100.0f, statistics);
    EXPECT_EQ(statistics.cdf, expected.cdf);
    EXPECT_EQ(statistics.faceMedianBin, expected.faceMedianBin);
    EXPECT_GT(expected.faceMedianBin, 0);
  }
}

TEST(ImageStatistics, CountAPixelOncePerBoxWithoutMovingTheMedian) {
  const auto photo = photoLikePicture(50, 40, 3);
  const BoundingBox whole{0, 49, 39, 0};
  EXPECT_EQ(statisticsOf(photo, withFaces({whole})).faceMedianBin,
            statisticsOf(photo, withFaces({whole, whole})).faceMedianBin);
  // Two boxes over the dark half outweigh one over the bright half.
  Image<RGBA8Pixel> halves = flatPicture(10, 10, {20, 20, 20, 255});
  for (std::uint32_t y = 0; y < 10; ++y) {
    for (std::uint32_t x = 5; x < 10; ++x) halves.row(y)[x] = {200, 200, 200, 255};
  }
  const BoundingBox dark{0, 4, 9, 0}, bright{5, 9, 9, 0};
  const int darkMedian = statisticsOf(halves, withFaces({dark})).faceMedianBin;
  const int brightMedian = statisticsOf(halves, withFaces({bright})).faceMedianBin;
  EXPECT_LT(darkMedian, brightMedian);
  EXPECT_EQ(statisticsOf(halves, withFaces({dark, dark, bright})).faceMedianBin, darkMedian);
  EXPECT_EQ(statisticsOf(halves, withFaces({bright, dark, bright})).faceMedianBin, brightMedian);
}

TEST(ImageStatistics, CountOnlyTheInsideOfABoxThatReachesOut) {
  const auto photo = photoLikePicture(50, 40, 4);
  EXPECT_EQ(statisticsOf(photo, withFaces({{-2147483647 - 1, 10, 2147483647, 25}})).faceMedianBin,
            statisticsOf(photo, withFaces({{0, 10, 39, 25}})).faceMedianBin);
  EXPECT_EQ(statisticsOf(photo, withFaces({{30, 2147483647, 12, -3}})).faceMedianBin,
            statisticsOf(photo, withFaces({{30, 49, 12, 0}})).faceMedianBin);
}

TEST(ImageStatistics, IncludeThePixelsOnTheBoxEdges) {
  Image<RGBA8Pixel> image = flatPicture(5, 5, {10, 10, 10, 255});
  image.row(2)[3] = {250, 250, 250, 255};
  const int bright = statisticsOf(image, withFaces({{3, 3, 2, 2}})).faceMedianBin;
  EXPECT_GT(bright, 40);
}

TEST(ImageStatistics, OfAnEmptyImageAreZero) {
  const ImageStatistics statistics =
      statisticsOf(Image<RGBA8Pixel>(0, 7), withFaces({{0, 3, 3, 0}}));
  ASSERT_EQ(statistics.cdf.size(), 51u);
  for (const float entry : statistics.cdf) EXPECT_EQ(entry, 0.0f);
  EXPECT_EQ(statistics.faceMedianBin, -1);
}

TEST(ImageStatistics, StopCountingAtTwoToTheTwentyFour) {
  // 4097 x 4097 pixels, one more than 2^24 in one bin: count and total stop together.
  Image<RGBA8Pixel> image = flatPicture(4097, 4097, {0, 0, 0, 255});
  std::fill_n(image.data.get(), 1000, RGBA8Pixel{255, 255, 255, 255});
  std::vector<float> histogram;
  std::int32_t faceMedian = 0;
  computeHistograms(image, {}, 50, 100.0f, histogram, faceMedian);
  EXPECT_EQ(histogram[0], 1.0f);
  EXPECT_EQ(histogram[49], 1000.0f * (1.0f / 16777216.0f));
  EXPECT_GT(statisticsOf(image).cdf[50], 1.0f);
}

TEST(ImageStatistics, BinBySharesOfTheScale) {
  Image<RGBA8Pixel> ramp(256, 1);
  for (std::uint32_t x = 0; x < 256; ++x) {
    const auto code = static_cast<std::uint8_t>(x);
    ramp.row(0)[x] = {code, code, code, 255};
  }
  std::vector<float> histogram;
  std::int32_t faceMedian = 0;
  computeHistograms(ramp, {}, 50, 100.0f, histogram, faceMedian);
  std::vector<int> expected(50);
  for (int code = 0; code < 256; ++code) {
    ++expected[static_cast<int>(49.0f * rgbToLab(code, code, code).L / 100.0f)];
  }
  for (int bin = 0; bin < 50; ++bin) EXPECT_EQ(histogram[bin], expected[bin] / 256.0f) << bin;
}

}  // namespace
}  // namespace pelorin::image_processing
