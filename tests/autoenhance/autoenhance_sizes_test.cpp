#include <gtest/gtest.h>

#include <cstring>
#include <numeric>
#include <stdexcept>

#include "image_processing/autoenhance/lab_tone_pass.h"
#include "image_processing/autoenhance/lightness/image_statistics.h"
#include "image_processing/autoenhance/masks/bilateral_grid.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::photoLikePicture;

// Each image is the whole of its allocation, so that the address sanitizer sees a write beyond it.
TEST(Sizes, TheGridFilterNeedsAnOutputOfThePicturesSize) {
  Image<float> lightness(30, 20);
  lightness.set(0.5f);
  for (const auto& [width, height] : {std::pair{30u, 19u}, {29u, 20u}, {0u, 0u}, {600u, 1u}}) {
    Image<float> smoothed(width, height);
    EXPECT_THROW(bilateralFilterGridApproximation(lightness, 0.1f, 5.0f, smoothed),
                 std::invalid_argument);
    EXPECT_THROW(bilateralFilterGridApproximationScalar(lightness, 0.1f, 5.0f, smoothed),
                 std::invalid_argument);
  }
}

TEST(Sizes, MasksSmallerThanThePhotoAreOff) {
  const auto photo = photoLikePicture(30, 20, 1);
  std::vector<float> curve(51);
  std::iota(curve.begin(), curve.end(), 0.0f);
  for (float& sample : curve) sample /= 50.0f;
  Image<RGBA8Pixel> plain(30, 20), output(30, 20);
  imageVibranceLabAndToneCurve(photo, plain, defaultFilterConfigValue, curve, 100.0f,
                               ImageMasks<float, float>{});
  for (const auto& [bilateral, ltm] : {std::pair{19u, 20u}, {20u, 19u}, {0u, 0u}}) {
    const ImageMasks<float, float> masks = {makeSharedImage<float>(30, bilateral),
                                            makeSharedImage<float>(30, ltm)};
    masks.bilateralMask->set(0.25f);
    masks.ltmMask->set(0.5f);
    imageVibranceLabAndToneCurve(photo, output, defaultFilterConfigValue, curve, 100.0f, masks);
    EXPECT_EQ(std::memcmp(output.data.get(), plain.data.get(), plain.byteSize()), 0);
  }
}

TEST(Sizes, StatisticsNeedABin) {
  const auto photo = photoLikePicture(30, 20, 1);
  ImageStatistics statistics;
  std::vector<float> histogram;
  std::int32_t median = 0;
  for (const int bins : {0, -1, INT32_MIN}) {
    EXPECT_THROW(computeImageStatistics(photo, {}, bins, 100.0f, statistics),
                 std::invalid_argument);
    EXPECT_THROW(computeHistograms(photo, {}, bins, 100.0f, histogram, median),
                 std::invalid_argument);
  }
  computeHistograms(photo, {}, 1, 100.0f, histogram, median);
  EXPECT_FLOAT_EQ(histogram.at(0), 1.0f);
}

}  // namespace
}  // namespace pelorin::image_processing
