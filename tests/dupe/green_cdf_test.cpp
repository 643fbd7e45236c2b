#include "image_processing/dupe/green_cdf.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <cstring>
#include <utility>

#include "image_processing/dupe/packed_cdf.h"
#include "tests/support/green_cdf.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::cdfOf;
using test_support::flatPicture;
using test_support::noisePicture;
using test_support::photoLikePicture;

void expectTheScalarDefinition(const Image<RGBA8Pixel>& image) {
  GreenCDF expected;
  computeGreenCDFScalar(image, expected);
  const GreenCDF actual = cdfOf(image);
  EXPECT_EQ(std::memcmp(actual.data(), expected.data(), sizeof expected), 0)
      << image.width << " x " << image.height;
}

TEST(GreenCDF, HoldsTheShareOfPixelsAtOrBelowEachGreen) {
  Image<RGBA8Pixel> image(4, 1);
  const RGBA8Pixel pixels[] = {{9, 0, 9, 9}, {8, 100, 8, 8}, {7, 100, 7, 7}, {6, 255, 6, 6}};
  std::copy(std::begin(pixels), std::end(pixels), image.data.get());
  const GreenCDF cdf = cdfOf(image);
  EXPECT_EQ(cdf[0], 0.25f);
  EXPECT_EQ(cdf[99], 0.25f);
  EXPECT_EQ(cdf[100], 0.75f);
  EXPECT_EQ(cdf[254], 0.75f);
  EXPECT_EQ(cdf[255], 1.0f);
}

TEST(GreenCounter, CountsPiecesAsTheWhole) {
  const Image<RGBA8Pixel> image = photoLikePicture(131, 57, 4);
  GreenCounter counter;
  for (std::uint32_t y = 0; y < image.height; ++y) counter.add(image.row(y), image.width);
  EXPECT_EQ(counter.cdf(), cdfOf(image));
  EXPECT_EQ(GreenCounter().cdf(), GreenCDF{});
}

TEST(GreenCDF, IsAllZeroForAnEmptyImage) {
  const GreenCDF zeros{};
  for (const auto& [width, height] : {std::pair{0u, 5u}, {5u, 0u}, {0u, 0u}}) {
    EXPECT_EQ(cdfOf(Image<RGBA8Pixel>(width, height)), zeros);
    expectTheScalarDefinition(Image<RGBA8Pixel>(width, height));
  }
}

TEST(GreenCDF, IsOneFromTheFirstBinOnForAnAllBlackImage) {
  for (const float entry : cdfOf(flatPicture(5, 3, {0, 0, 0, 255}))) EXPECT_EQ(entry, 1.0f);
}

TEST(GreenCDF, IsAStepForAnImageOfOneGreen) {
  const GreenCDF cdf = cdfOf(flatPicture(7, 3, {250, 128, 250, 0}));
  for (std::size_t i = 0; i < cdf.size(); ++i) EXPECT_EQ(cdf[i], i < 128 ? 0.0f : 1.0f);
}

TEST(GreenCDF, NeverDecreasesAndEndsAtOne) {
  const GreenCDF cdf = cdfOf(photoLikePicture(301, 199, 3));
  EXPECT_TRUE(std::is_sorted(cdf.begin(), cdf.end()));
  EXPECT_NEAR(cdf[255], 1.0f, 1e-5f);
}

TEST(GreenCDF, MatchesTheScalarDefinitionByteForByte) {
  for (std::uint32_t count = 0; count <= 70; ++count) {
    expectTheScalarDefinition(noisePicture(count, 1, count));
  }
  expectTheScalarDefinition(noisePicture(311, 207, 1));
  expectTheScalarDefinition(photoLikePicture(640, 480, 2));
  expectTheScalarDefinition(flatPicture(640, 480, {1, 2, 3, 4}));
}

TEST(GreenCDF, CountsAsFloatCountersThatStopAtTwoToTheTwentyFour) {
  // One bin and the pixel count stop, the other bin does not.
  constexpr std::uint32_t width = 4096, height = 4196;
  const Image<RGBA8Pixel> image = flatPicture(width, height, {0, 200, 0, 255});
  for (std::uint32_t x = 0; x < width; ++x) image.row(0)[x].g = 10;
  expectTheScalarDefinition(image);
  const GreenCDF cdf = cdfOf(image);
  EXPECT_EQ(cdf[199], 4096.0f / 16777216.0f);
  EXPECT_EQ(cdf[200], 4096.0f / 16777216.0f + 1.0f);
}

void expectSame(const GreenCDF& actual, const GreenCDF& expected) {
  EXPECT_EQ(std::memcmp(actual.data(), expected.data(), sizeof actual), 0);
}

TEST(PackedCDF, HoldsTheCountsOfAPhotoInAThirdOfTheRoom) {
  for (const auto& [width, height] : {std::pair{500u, 375u}, {1u, 1u}, {320u, 240u}, {67u, 3u}}) {
    for (std::uint64_t seed = 0; seed < 5; ++seed) {
      const GreenCDF cdf = cdfOf(photoLikePicture(width, height, seed));
      const PackedCDF packed(cdf, std::uint64_t{width} * height);
      expectSame(packed.unpacked(), cdf);
      EXPECT_LT(packed.byteCount(), sizeof cdf * 2 / 5) << width << 'x' << height;
    }
  }
}

TEST(PackedCDF, HoldsCountsOfEverySize) {
  std::array<float, 256> histogram{};
  for (int width = 0; width <= 24; ++width) {
    histogram[10 * width] = static_cast<float>((1 << width) - 1);
    histogram[10 * width + 1] = 1.0f;
    float pixels = 0.0f;
    for (const float count : histogram) pixels += count;
    GreenCDF cdf;
    computeCDFFromCounts(histogram, std::min(pixels, 16777216.0f), cdf);
    expectSame(PackedCDF(cdf, static_cast<std::uint64_t>(pixels)).unpacked(), cdf);
  }
  // What counters hold that have stopped at 2^24: more than all pixels.
  histogram.fill(16777216.0f);
  GreenCDF cdf;
  computeCDFFromCounts(histogram, 16777216.0f, cdf);
  const PackedCDF packed(cdf, std::uint64_t{1} << 40);
  expectSame(packed.unpacked(), cdf);
  EXPECT_LT(packed.byteCount(), sizeof cdf);
}

TEST(PackedCDF, LosesNothingOfWhatIsNotMadeOfCounts) {
  const GreenCDF photo = cdfOf(photoLikePicture(64, 48, 1));
  for (const float odd :
       {std::nanf(""), std::nanf("7"), HUGE_VALF, -HUGE_VALF, -0.0f, -1.0f, 3e38f, 1e-45f}) {
    for (const std::size_t place : {0u, 100u, 255u}) {
      GreenCDF cdf = photo;
      cdf[place] = odd;
      expectSame(PackedCDF(cdf, 64 * 48).unpacked(), cdf);
    }
  }
  for (const std::uint64_t wrong :
       {std::uint64_t{0}, std::uint64_t{64 * 48 - 1}, ~std::uint64_t{0}}) {
    expectSame(PackedCDF(photo, wrong).unpacked(), photo);
  }
  expectSame(PackedCDF().unpacked(), GreenCDF{});
  expectSame(PackedCDF(GreenCDF{}).unpacked(), GreenCDF{});
}

}  // namespace
}  // namespace pelorin::image_processing
