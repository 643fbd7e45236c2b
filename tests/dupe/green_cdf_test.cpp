#include "image_processing/dupe/green_cdf.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <utility>

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

}  // namespace
}  // namespace pelorin::image_processing
