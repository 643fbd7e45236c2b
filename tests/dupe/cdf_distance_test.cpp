#include "image_processing/dupe/cdf_distance.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstring>
#include <limits>
#include <vector>

#include "image_processing/dupe/prepared_cdf.h"
#include "image_processing/dupe/quantiles.h"
#include "tests/dupe/synthetic_cdfs.h"
#include "tests/support/fingerprint.h"
#include "tests/support/green_cdf.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::anotherShot;
using test_support::cdfOf;
using test_support::flatPicture;
using test_support::photoLikePicture;
using test_support::syntheticCDF;

constexpr int smallestInt = std::numeric_limits<int>::min();
constexpr int largestInt = std::numeric_limits<int>::max();
constexpr float infinity = std::numeric_limits<float>::infinity();

GreenCDF evenCDF() {
  GreenCDF cdf;
  for (std::size_t i = 0; i < cdf.size(); ++i) cdf[i] = static_cast<float>(i + 1) / 256.0f;
  return cdf;
}

float matchByDefinition(const GreenCDF& a, const GreenCDF& b, GreenCDF& mapped) {
  Quantiles quantilesA, quantilesB;
  invertScalar(a, quantilesA);
  invertScalar(b, quantilesB);
  const float gain = fitGain(gainSamplesOf(quantilesA), gainSamplesOf(quantilesB));
  for (float& quantile : quantilesA) quantile = std::min(gain * quantile, 255.0f);
  invertScalar(quantilesA, mapped);
  for (float& entry : mapped) entry = static_cast<float>(entry * double{1.0f / 255.0f});
  return gain;
}

/// The distance as its definition reads: both directions matched in full, then one compared.
float distanceByDefinition(GreenCDF a, GreenCDF b) {
  GreenCDF x, y;
  const float gainAB = matchByDefinition(a, b, x);
  const float gainBA = matchByDefinition(b, a, y);
  if (gainAB > gainBA) {
    clipCDF(b, 8);
    clipCDF(x, 8);
    return KSTest(x, b, 8);
  }
  clipCDF(a, 8);
  clipCDF(y, 8);
  return KSTest(a, y, 8);
}

TEST(ClipCDF, StretchesTheMiddleAndClampsBothEnds) {
  GreenCDF cdf = evenCDF();
  clipCDF(cdf, 8);
  for (std::size_t i = 0; i <= 8; ++i) EXPECT_EQ(cdf[i], 0.0f);
  for (std::size_t i = 247; i < 256; ++i) EXPECT_EQ(cdf[i], 1.0f);
  EXPECT_EQ(cdf[9], (10.0f / 256.0f - 9.0f / 256.0f) / (248.0f / 256.0f - 9.0f / 256.0f));
}

TEST(ClipCDF, LeavesAnAllBlackPictureAsItIs) {
  const GreenCDF black = cdfOf(flatPicture(4, 4, {0, 0, 0, 255}));
  GreenCDF cdf = black;
  clipCDF(cdf, 8);
  EXPECT_EQ(cdf, black);
}

TEST(ClipCDF, LeavesADistributionWithAnEmptyOrReversedRangeAsItIs) {
  GreenCDF falling = evenCDF();
  std::reverse(falling.begin(), falling.end());
  GreenCDF cdf = falling;
  clipCDF(cdf, 8);
  EXPECT_EQ(cdf, falling);
  cdf = evenCDF();
  clipCDF(cdf, 128);  // entry 127 less entry 128
  EXPECT_EQ(cdf, evenCDF());
}

TEST(ClipCDF, DoesNothingForBinCountsOutsideTheDistribution) {
  for (const int k :
       {129, 255, 256, 1000, largestInt, -1, -8, -128, smallestInt + 1, smallestInt}) {
    GreenCDF cdf = evenCDF();
    clipCDF(cdf, k);
    EXPECT_EQ(cdf, evenCDF()) << k;
  }
}

TEST(KSTest, IsTheLargestDifferenceBetweenTheMargins) {
  const GreenCDF a{};
  GreenCDF b{};
  b[7] = 0.9f;
  b[8] = 0.2f;
  b[200] = -0.3f;
  b[247] = 0.25f;
  b[248] = 0.8f;
  EXPECT_EQ(KSTest(a, b, 8), 0.3f);
  EXPECT_EQ(KSTest(b, a, 8), 0.3f);
  EXPECT_EQ(KSTest(a, b, 0), 0.9f);
}

TEST(KSTest, TakesBinCountsOfEitherSignAlike) {
  const GreenCDF a = syntheticCDF(1), b = syntheticCDF(2);
  for (int k = 0; k <= 130; ++k) EXPECT_EQ(KSTest(a, b, -k), KSTest(a, b, k)) << k;
  EXPECT_GT(KSTest(a, b, -8), 0.0f);
}

TEST(KSTest, LooksAtTheTwoMiddleEntriesAt127AndAtNoneBeyond) {
  const GreenCDF zeros{}, ones = cdfOf(flatPicture(1, 1, {0, 0, 0, 0}));
  EXPECT_EQ(KSTest(zeros, ones, 127), 1.0f);
  for (const int k : {128, -128, 129, 256, largestInt, smallestInt + 1, smallestInt}) {
    EXPECT_EQ(KSTest(zeros, ones, k), 0.0f) << k;
  }
}

TEST(KSTest, PassesOverNaN) {
  GreenCDF a{};
  a[20] = 0.5f;
  a[100] = std::nanf("");
  EXPECT_EQ(KSTest(a, GreenCDF{}, 8), 0.5f);
}

TEST(InvertCDF, OfNothingIsNothing) {
  EXPECT_TRUE(invertCDF({}).empty());
}

TEST(InvertCDF, OfOneEntryIsZero) {
  EXPECT_EQ(invertCDF({0.7f}), std::vector<float>{0.0f});
}

TEST(InvertCDF, InterpolatesWhereEachLevelIsReached) {
  // Levels 0, 1/4, 1/2, 3/4, 1.
  EXPECT_EQ(invertCDF({0.0f, 0.5f, 0.5f, 0.5f, 1.0f}),
            (std::vector<float>{0.0f, 0.5f, 1.0f, 3.5f, 4.0f}));
}

TEST(InvertCDF, StartsAtZeroWhileTheFirstEntryCoversTheLevel) {
  EXPECT_EQ(invertCDF({0.6f, 0.6f, 0.6f, 0.6f, 1.0f}),
            (std::vector<float>{0.0f, 0.0f, 0.0f, 3.0f + (0.75f - 0.6f) / (1.0f - 0.6f), 4.0f}));
}

TEST(InvertCDF, TakesTheMiddleOfAStepWithoutRise) {
  // Level 1 is first passed at entry 1, level 2 at none, so the search stays where nothing rises.
  EXPECT_EQ(invertCDF({infinity, infinity, infinity}), (std::vector<float>{0.0f, 0.0f, 2.0f}));
  const std::vector<float> inverse = invertCDF({-1.0f, -1.0f, -1.0f, -2.0f});
  // Levels 0, -2/3, -4/3: the first lies above every entry.
  EXPECT_EQ(inverse[0], 3.0f);
  EXPECT_EQ(inverse[3], 3.0f);
}

TEST(InvertCDF, TwiceIsLossy) {
  const GreenCDF cdf = evenCDF();
  const std::vector<float> twice = invertCDF(invertCDF({cdf.begin(), cdf.end()}));
  float largest = 0.0f;
  for (std::size_t i = 0; i < 256; ++i) {
    largest = std::max(largest, std::fabs(twice[i] / 255.0f - cdf[i]));
  }
  EXPECT_GT(largest, 1e-3f);
  EXPECT_LT(largest, 1e-2f);
}

TEST(InvertCDF, ReadsNoEntryButItsOwnWhateverTheFloats) {
  const float nan = std::nanf("");
  for (const float odd : {nan, infinity, -infinity, -1.0f, 3e38f, -3e38f, 1e-45f, 0.0f}) {
    for (std::size_t length = 1; length < 9; ++length) {
      for (std::size_t place = 0; place < length; ++place) {
        std::vector<float> v(length, 0.5f);
        v[place] = odd;
        v.shrink_to_fit();
        const std::vector<float> inverse = invertCDF(v);
        ASSERT_EQ(inverse.size(), length);
        EXPECT_EQ(inverse.back(), static_cast<float>(length - 1));
      }
    }
  }
}

// Those of photos, ever flatter, and what is none: values that fall, end at 0 or are no numbers.
TEST(Invert, IsItsDefinitionBitForBit) {
  const auto isDefinition = [](const Quantiles& v) {
    Quantiles expected, actual;
    invertScalar(v, expected);
    invert(v, actual);
    return std::memcmp(actual.data(), expected.data(), sizeof actual) == 0;
  };
  test_support::Random random(5);
  for (std::uint64_t seed = 0; seed < 1000; ++seed) {
    Quantiles v = syntheticCDF(seed);
    const float scale = std::pow(10.0f, static_cast<float>(random.below(76)) - 37.0f);
    for (float& entry : v) entry *= scale;
    ASSERT_TRUE(isDefinition(v)) << seed;
    // Steps, levels that are met exactly, and one place changed.
    for (float& entry : v) entry = std::floor(entry / scale * static_cast<float>(1 + seed % 300));
    ASSERT_TRUE(isDefinition(v)) << seed;
    v[random.below(256)] = std::array{-1.0f, 0.0f, infinity, std::nanf(""), 1e-45f}[seed % 5];
    ASSERT_TRUE(isDefinition(v)) << seed;
    Quantiles inverse;
    invertScalar(syntheticCDF(seed), inverse);
    for (float& entry : inverse) entry = std::min(entry * 2.0f * random.nextFloat(), 255.0f);
    std::sort(inverse.begin(), inverse.end());
    ASSERT_TRUE(isDefinition(inverse)) << seed;
  }
  EXPECT_TRUE(isDefinition(Quantiles{}));
  EXPECT_TRUE(isDefinition(cdfOf(flatPicture(1, 1, {0, 255, 0, 255}))));
}

TEST(MatchCDFDomain, FindsGainOneBetweenTheSamePhotos) {
  for (std::uint64_t seed = 0; seed < 20; ++seed) {
    const GreenCDF cdf = syntheticCDF(seed);
    EXPECT_EQ(matchCDFDomain(cdf, cdf), 1.0f);
  }
}

TEST(MatchCDFDomain, FindsTheGainBetweenTwoExposures) {
  const Image<RGBA8Pixel> bright = photoLikePicture(320, 240, 4);
  Image<RGBA8Pixel> dark(320, 240);
  for (std::size_t i = 0; i < bright.pixelCount(); ++i) {
    dark.data.get()[i].g = static_cast<std::uint8_t>(bright.data.get()[i].g / 2);
  }
  EXPECT_NEAR(matchCDFDomain(cdfOf(dark), cdfOf(bright)), 2.0f, 0.03f);
  EXPECT_NEAR(matchCDFDomain(cdfOf(bright), cdfOf(dark)), 0.6f, 0.1f);  // the last sample is fixed
}

TEST(MatchCDFDomain, LeavesItsInputsAndWritesTheOutputOnlyWhenThereIsOne) {
  const GreenCDF a = syntheticCDF(1), b = syntheticCDF(2);
  GreenCDF inputA = a, inputB = b, mapped, inPlace = a;
  const float gain = matchCDFDomain(inputA, inputB, &mapped);
  EXPECT_EQ(inputA, a);
  EXPECT_EQ(inputB, b);
  EXPECT_EQ(matchCDFDomain(a, b), gain);
  EXPECT_EQ(matchCDFDomain(inPlace, b, &inPlace), gain);
  EXPECT_EQ(inPlace, mapped);
}

TEST(MatchCDFDomain, MapsTheDistributionByTheGainThroughItsInverse) {
  const GreenCDF a = syntheticCDF(5), b = syntheticCDF(6);
  GreenCDF mapped;
  const float gain = matchCDFDomain(a, b, &mapped);
  std::vector<float> quantiles = invertCDF({a.begin(), a.end()});
  for (float& quantile : quantiles) quantile = std::min(gain * quantile, 255.0f);
  const std::vector<float> back = invertCDF(quantiles);
  const float scale = 1.0f / 255.0f;
  for (std::size_t i = 0; i < 256; ++i) {
    EXPECT_EQ(mapped[i], static_cast<float>(static_cast<double>(back[i]) * scale));
  }
}

TEST(MatchCDFDomain, KeepsGainOneWhenAnEmptyImageIsMatchedToItself) {
  // Nothing to invert: every level is 0, and only the last sample is not.
  GreenCDF mapped;
  EXPECT_EQ(matchCDFDomain(GreenCDF{}, GreenCDF{}, &mapped), 1.0f);
  EXPECT_EQ(mapped[0], 0.0f);
  EXPECT_EQ(mapped[255], 1.0f);
}

TEST(MatchCDFDomain, EndsForAnyFloats) {
  for (const float odd : {std::nanf(""), infinity, -infinity, -1.0f, 3e38f, 1e-45f}) {
    for (const std::size_t place : {0u, 1u, 100u, 254u, 255u}) {
      GreenCDF a = syntheticCDF(7), mapped;
      a[place] = odd;
      matchCDFDomain(a, syntheticCDF(8), &mapped);
      matchCDFDomain(syntheticCDF(8), a, &mapped);
      EXPECT_GE(exposureInvariantCDFDistance(a, syntheticCDF(8)), 0.0f);
      EXPECT_GE(exposureInvariantCDFDistance(syntheticCDF(8), a), 0.0f);
    }
  }
}

TEST(CDFDistance, IsItsDefinitionBitForBit) {
  for (std::uint64_t seed = 0; seed < 300; ++seed) {
    const GreenCDF a = syntheticCDF(seed), b = syntheticCDF(seed / 3 + 1000);
    const GreenCDF c = anotherShot(a, 0.001f, seed);
    EXPECT_EQ(exposureInvariantCDFDistance(a, b), distanceByDefinition(a, b)) << seed;
    EXPECT_EQ(exposureInvariantCDFDistance(a, c), distanceByDefinition(a, c)) << seed;
    EXPECT_EQ(exposureInvariantCDFDistance(a, a), distanceByDefinition(a, a)) << seed;
  }
}

TEST(CDFDistance, OfAPhotoToItselfIsSmallButNotZero) {
  for (std::uint64_t seed = 0; seed < 12; ++seed) {
    const GreenCDF cdf = cdfOf(photoLikePicture(320, 240, seed));
    const float distance = exposureInvariantCDFDistance(cdf, cdf);
    EXPECT_GT(distance, 0.0f) << seed;
    EXPECT_LT(distance, 0.005f) << seed;
  }
}

TEST(CDFDistance, OfAnAllBlackPictureToItselfIsOne) {
  const GreenCDF black = cdfOf(flatPicture(8, 8, {0, 0, 0, 255}));
  EXPECT_EQ(exposureInvariantCDFDistance(black, black), 1.0f);
}

TEST(CDFDistance, TakesEmptyImages) {
  const GreenCDF empty{}, photo = syntheticCDF(3);
  for (const float distance :
       {exposureInvariantCDFDistance(empty, empty), exposureInvariantCDFDistance(empty, photo),
        exposureInvariantCDFDistance(photo, empty)}) {
    EXPECT_GE(distance, 0.0f);
    EXPECT_LE(distance, 1.0f);
  }
}

TEST(CDFDistance, IsSymmetricWhereTheGainsDiffer) {
  int differ = 0;
  for (std::uint64_t seed = 0; seed < 200; ++seed) {
    const GreenCDF a = syntheticCDF(seed), b = syntheticCDF(seed + 500);
    if (matchCDFDomain(a, b) == matchCDFDomain(b, a)) continue;
    ++differ;
    EXPECT_EQ(exposureInvariantCDFDistance(a, b), exposureInvariantCDFDistance(b, a)) << seed;
  }
  EXPECT_GT(differ, 150);
}

TEST(CDFDistance, MapsTheSecondWhenBothGainsAreEqual) {
  // Alike at every level a gain is fitted at, different in between.
  const GreenCDF a = evenCDF();
  GreenCDF b = a;
  for (std::size_t i = 33; i < 42; ++i) b[i] = b[42];
  ASSERT_EQ(matchCDFDomain(a, b), 1.0f);
  ASSERT_EQ(matchCDFDomain(b, a), 1.0f);

  const auto secondMapped = [](GreenCDF first, GreenCDF second) {
    GreenCDF mapped;
    matchCDFDomain(second, first, &mapped);
    clipCDF(first, 8);
    clipCDF(mapped, 8);
    return KSTest(first, mapped, 8);
  };
  EXPECT_EQ(exposureInvariantCDFDistance(a, b), secondMapped(a, b));
  EXPECT_EQ(exposureInvariantCDFDistance(b, a), secondMapped(b, a));
  EXPECT_NE(secondMapped(a, b), secondMapped(b, a));
}

TEST(CDFDistance, IsCloseToZeroForTheSameSceneInAnotherExposure) {
  // A burst of exposures: every green scaled, none clipped.
  for (std::uint64_t seed = 0; seed < 6; ++seed) {
    const Image<RGBA8Pixel> scene = photoLikePicture(320, 240, seed);
    for (const std::uint32_t percent : {25, 40, 60, 75, 90}) {
      Image<RGBA8Pixel> shot(scene.width, scene.height);
      for (std::size_t i = 0; i < scene.pixelCount(); ++i) {
        shot.data.get()[i].g = static_cast<std::uint8_t>(scene.data.get()[i].g * percent / 100);
      }
      EXPECT_LT(exposureInvariantCDFDistance(cdfOf(scene), cdfOf(shot)), 0.06f)
          << seed << ' ' << percent;
    }
  }
}

TEST(CDFDistance, TellsScenesApart) {
  const GreenCDF dusk = cdfOf(photoLikePicture(320, 240, 1));
  GreenCDF twoTones{};
  for (std::size_t i = 60; i < 256; ++i) twoTones[i] = i < 200 ? 0.5f : 1.0f;
  EXPECT_GT(exposureInvariantCDFDistance(dusk, twoTones), 0.2f);
}

// The bits of the plain definition; nothing but + - * / and comparisons is in them, so that every
// platform has the same.
TEST(CDFDistance, HasTheRecordedBits) {
  std::vector<float> distances;
  for (std::uint64_t seed = 0; seed < 64; ++seed) {
    distances.push_back(distanceByDefinition(syntheticCDF(seed), syntheticCDF(seed + 64)));
    distances.push_back(distanceByDefinition(syntheticCDF(seed), syntheticCDF(seed)));
  }
  EXPECT_EQ(test_support::fingerprint(distances.data(), distances.size() * sizeof(float)),
            "5919072ee1ae4864");
}

}  // namespace
}  // namespace pelorin::image_processing
