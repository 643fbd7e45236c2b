#include "image_processing/features/fast.h"

#include <gtest/gtest.h>
#include <sys/mman.h>

#include <climits>
#include <cstring>

#include "image_processing/features/fast_corner.h"
#include "tests/features/brute_force.h"
#include "tests/features/fast_variants.h"
#include "tests/support/fingerprint.h"
#include "tests/support/slow_build.h"

namespace pelorin::test_support {
namespace {

using image_processing::fastCircle;
using test_support::slowBuild;

TEST(FastDetect, FindsNothingWhereAWidthOrHeightIsSixOrLess) {
  const GreyImage noise = greyNoise(40, 40, 1);
  for (const FastVariant& variant : fastVariants) {
    for (const int small : {6, 5, 3, 1, 0, -1, -7, INT_MIN}) {
      for (const int other : {small, 40, INT_MAX}) {
        for (const auto& [width, height] : {xy{small, other}, xy{other, small}}) {
          int count = -1;
          xy* corners = variant.detect(noise.data.get(), width, height, 40, 0, &count);
          EXPECT_NE(corners, nullptr) << "nothing found still is an array";
          EXPECT_EQ(count, 0);
          std::free(corners);
          count = -1;
          corners = variant.detectNonmax(noise.data.get(), width, height, 40, 0, &count);
          EXPECT_EQ(corners, nullptr);
          EXPECT_EQ(count, 0);
        }
      }
    }
  }
}

TEST(FastDetect, FindsTheOneInnerPixelOfSevenBySeven) {
  GreyImage image = greyFlat(7, 7, 10);
  image.row(3)[3] = 200;
  for (const FastVariant& variant : fastVariants) {
    EXPECT_EQ(detect(variant.detect, image, 20), (std::vector<xy>{{3, 3}}));
    EXPECT_EQ(detect(variant.detectNonmax, image, 20), (std::vector<xy>{{3, 3}}));
  }
}

TEST(FastDetect, TakesNoPixelsForAnEmptyPicture) {
  for (const FastVariant& variant : fastVariants) {
    int count = -1;
    xy* const corners = variant.detect(nullptr, 100, 100, 100, 20, &count);
    EXPECT_NE(corners, nullptr);
    EXPECT_EQ(count, 0);
    std::free(corners);
    count = -1;
    EXPECT_EQ(variant.detectNonmax(nullptr, 100, 100, 100, 20, &count), nullptr);
    EXPECT_EQ(count, 0);
    const xy corner = {3, 3};
    EXPECT_EQ(variant.score(nullptr, 100, &corner, 1, 20), nullptr);
  }
}

TEST(FastDetect, GivesAnEmptyArrayForAFlatPicture) {
  const GreyImage flat = greyFlat(50, 50, 128);
  int count = -1;
  xy* const corners = fast9_detect(flat.data.get(), 50, 50, 50, 0, &count);
  EXPECT_NE(corners, nullptr);
  EXPECT_EQ(count, 0);
  std::free(corners);
}

void expectBruteForceCorners(const GreyImage& image, int b) {
  for (const FastVariant& variant : fastVariants) {
    const std::vector<xy> expected = cornersByBruteForce(image, variant.arc, b);
    ASSERT_EQ(detect(variant.detect, image, b), expected) << variant.arc << " of 16 at " << b;
    std::vector<int> scores;
    for (const xy& corner : expected) {
      scores.push_back(
          scoreByBruteForce(image, corner.x, corner.y, variant.arc, std::max(b, -256)));
    }
    const std::vector<xy> maxima = maximaByBruteForce(expected, scores);
    ASSERT_EQ(detect(variant.detectNonmax, image, b), maxima) << variant.arc << " of 16 at " << b;
  }
}

bool leftOut(int threshold) {
  return slowBuild && threshold % 5 != 0;
}

TEST(FastDetect, EqualsBruteForceOnNoise) {
  for (const int b : {0, 1, 5, 20, 60, 100, 127, 128, 200, 253, 254, 255}) {
    if (leftOut(b)) continue;
    expectBruteForceCorners(greyNoise(83, 31, b), b);
  }
}

TEST(FastDetect, EqualsBruteForceOnPhotoLikePictures) {
  for (const int b : {0, 1, 2, 3, 5, 8, 13, 20, 34, 55, 89, 144, 233, 254, 255}) {
    if (leftOut(b)) continue;
    expectBruteForceCorners(greyPhoto(97, 41, b), b);
  }
}

TEST(FastDetect, EqualsBruteForceOnTwoTonePicturesWithManyTies) {
  for (const int b : {0, 20, 100, 254}) {
    GreyImage image = greyNoise(80, 30, b);
    for (std::size_t i = 0; i < image.pixelCount(); ++i) {
      image.data.get()[i] = image.data.get()[i] < 40 ? 255 : 0;
    }
    expectBruteForceCorners(image, b);
  }
}

TEST(FastDetect, EqualsBruteForceAtThresholdsOutsideABytesRange) {
  for (const int b : {-1, -2, -20, -255, -256, -257, INT_MIN, 256, 300, 1000, INT_MAX}) {
    expectBruteForceCorners(greyPhoto(30, 20, 3), b);
  }
}

TEST(FastDetect, FindsEveryInnerPixelAtVeryNegativeThresholds) {
  EXPECT_EQ(detect(fast9_detect, greyNoise(20, 10, 1), -256).size(), 14u * 4u);
  EXPECT_EQ(detect(fast12_detect, greyNoise(20, 10, 1), INT_MIN).size(), 14u * 4u);
}

TEST(FastDetect, KeepsRasterOrderPastTheFirst512Corners) {
  const GreyImage noise = greyNoise(200, 150, 9);
  const std::vector<xy> corners = detect(fast9_detect, noise, 5);
  ASSERT_GT(corners.size(), 1024u);
  EXPECT_EQ(corners, cornersByBruteForce(noise, 9, 5));
}

TEST(FastDetect, SkipsTheBytesBetweenRows) {
  const GreyImage image = greyPhoto(61, 40, 5);
  std::vector<unsigned char> padded(100 * 40, 255);
  for (std::uint32_t y = 0; y < 40; ++y) std::memcpy(&padded[100 * y], image.row(y), 61);
  for (const FastVariant& variant : fastVariants) {
    int count = 0;
    xy* const corners = variant.detect(padded.data(), 61, 40, 100, 10, &count);
    EXPECT_EQ(take(corners, count), detect(variant.detect, image, 10));
  }
}

TEST(FastDetect, ReadsRowsUpwardWithANegativeStride) {
  const GreyImage image = greyPhoto(61, 40, 6);
  GreyImage flipped(61, 40);
  for (std::uint32_t y = 0; y < 40; ++y) std::memcpy(flipped.row(39 - y), image.row(y), 61);
  for (const FastVariant& variant : fastVariants) {
    const std::vector<xy> expected = detect(variant.detect, image, 10);
    ASSERT_FALSE(expected.empty());
    int count = 0;
    xy* corners = variant.detect(flipped.row(39), 61, 40, -61, 10, &count);
    EXPECT_EQ(take(corners, count), expected);
    int* const scores = variant.score(flipped.row(39), -61, expected.data(), count, 10);
    EXPECT_EQ(take(scores, count), score(variant, image, expected, 10));
    corners = variant.detectNonmax(flipped.row(39), 61, 40, -61, 10, &count);
    EXPECT_EQ(take(corners, count), detect(variant.detectNonmax, image, 10));
  }
}

TEST(FastDetect, AddressesMoreThanFourGigabytes) {
  constexpr long long stride = 1 << 29;
  constexpr int width = 80, height = 12;
  if (sizeof(void*) < 8) GTEST_SKIP() << "no such addresses";
  const auto bytes = static_cast<std::size_t>(stride * height);
  // Only the touched pages come into being.
  void* const memory = mmap(nullptr, bytes, PROT_READ | PROT_WRITE,
                            MAP_PRIVATE | MAP_ANONYMOUS | MAP_NORESERVE, -1, 0);
  if (memory == MAP_FAILED) GTEST_SKIP() << "6 GB of address space are not to be had";
  auto* const pixels = static_cast<unsigned char*>(memory);
  const GreyImage image = greyNoise(width, height, 4);
  for (int y = 0; y < height; ++y) std::memcpy(pixels + y * stride, image.row(y), width);

  const std::vector<xy> expected = detect(fast9_detect, image, 30);
  ASSERT_FALSE(expected.empty());
  int count = 0;
  xy* corners = fast9_detect(pixels, width, height, stride, 30, &count);
  EXPECT_EQ(take(corners, count), expected);
  int* const scores = fast9_score(pixels, stride, expected.data(), count, 30);
  EXPECT_EQ(take(scores, count), score(fastVariants[0], image, expected, 30));
  corners = fast9_detect_nonmax(pixels, width, height, stride, 30, &count);
  EXPECT_EQ(take(corners, count), detect(fast9_detect_nonmax, image, 30));
  munmap(memory, bytes);
}

TEST(FastScore, IsTheLargestThresholdThatStillDetects) {
  const GreyImage image = greyPhoto(60, 40, 2);
  for (const FastVariant& variant : fastVariants) {
    const std::vector<xy> corners = detect(variant.detect, image, 5);
    const std::vector<int> scores = score(variant, image, corners, 5);
    for (std::size_t i = 0; i < corners.size(); i += slowBuild ? 7 : 1) {
      const std::vector<xy> still = detect(variant.detect, image, scores[i]);
      const std::vector<xy> noMore = detect(variant.detect, image, scores[i] + 1);
      EXPECT_EQ(std::count(still.begin(), still.end(), corners[i]), 1);
      EXPECT_EQ(std::count(noMore.begin(), noMore.end(), corners[i]), 0);
    }
  }
}

TEST(FastScore, IsNeverBelowTheThresholdAndNeverAbove254) {
  GreyImage image = greyNoise(60, 40, 3);
  for (std::size_t i = 0; i < image.pixelCount(); i += 7) image.data.get()[i] = i % 2 ? 255 : 0;
  for (const FastVariant& variant : fastVariants) {
    for (const int b : {0, 1, 20, 100, 200}) {
      for (const int s : score(variant, image, detect(variant.detect, image, b), b)) {
        EXPECT_GE(s, b);
        EXPECT_LE(s, 254);
      }
    }
  }
  GreyImage dot = greyFlat(7, 7, 0);
  dot.row(3)[3] = 255;
  EXPECT_EQ(score(fastVariants[0], dot, {{3, 3}}, 0), std::vector<int>{254});
}

TEST(FastScore, IsTheThresholdWhereThePixelIsNoCornerOrTheThresholdIsTooHigh) {
  const GreyImage flat = greyFlat(7, 7, 90);
  for (const FastVariant& variant : fastVariants) {
    for (const int b : {0, 20, 254, 255, 256, 1000, INT_MAX}) {
      EXPECT_EQ(score(variant, flat, {{3, 3}}, b), std::vector<int>{b});
    }
    // No difference at all still is one above -1.
    EXPECT_EQ(score(variant, flat, {{3, 3}}, -1), std::vector<int>{-1});
    EXPECT_EQ(score(variant, flat, {{3, 3}}, INT_MIN), std::vector<int>{-1});
  }
}

TEST(FastScore, GivesAnArrayForNoCorners) {
  const GreyImage image = greyFlat(7, 7, 90);
  for (const FastVariant& variant : fastVariants) {
    for (const int count : {0, -1, INT_MIN}) {
      int* const scores = variant.score(image.data.get(), 7, nullptr, count, 20);
      EXPECT_NE(scores, nullptr);
      std::free(scores);
    }
  }
}

TEST(FastCornerScore, EqualsTheScoreOfTheCorner) {
  const GreyImage image = greyPhoto(60, 40, 4);
  std::array<int, 16> offsets;
  for (int i = 0; i < 16; ++i) offsets[i] = fastCircle[i].y * 60 + fastCircle[i].x;
  for (const FastVariant& variant : fastVariants) {
    for (const xy& corner : detect(variant.detect, image, 5)) {
      const unsigned char* const centre = image.row(corner.y) + corner.x;
      EXPECT_EQ(variant.cornerScore(centre, offsets.data(), 5),
                scoreByBruteForce(image, corner.x, corner.y, variant.arc, 5));
    }
  }
}

TEST(FastDetectNonmax, EqualsDetectScoreAndSuppress) {
  const GreyImage image = greyPhoto(300, 200, 8);
  for (const FastVariant& variant : fastVariants) {
    for (const int b : {0, 7, 20, 60, -3}) {
      const std::vector<xy> corners = detect(variant.detect, image, b);
      EXPECT_EQ(detect(variant.detectNonmax, image, b),
                suppress(corners, score(variant, image, corners, b)));
    }
  }
}

TEST(FastDetectNonmax, GivesAnEmptyArrayWhenAllCornersTie) {
  GreyImage image = greyFlat(20, 20, 0);
  image.row(10)[10] = image.row(10)[11] = 200;
  ASSERT_EQ(detect(fast9_detect, image, 20).size(), 2u);
  int count = -1;
  xy* const corners = fast9_detect_nonmax(image.data.get(), 20, 20, 20, 20, &count);
  EXPECT_NE(corners, nullptr);
  EXPECT_EQ(count, 0);
  std::free(corners);
}

// Positions and scores at threshold 20, then the maxima.
std::string goldenOf(const FastVariant& variant, const GreyImage& image) {
  const std::vector<xy> corners = detect(variant.detect, image, 20);
  const std::vector<int> scores = score(variant, image, corners, 20);
  const std::vector<xy> maxima = detect(variant.detectNonmax, image, 20);
  return std::to_string(corners.size()) + " " + std::to_string(maxima.size()) + " " +
         fingerprint(corners.data(), corners.size() * sizeof(xy)) + " " +
         fingerprint(scores.data(), scores.size() * sizeof(int)) + " " +
         fingerprint(maxima.data(), maxima.size() * sizeof(xy));
}

TEST(FastGolden, HoldsOnEveryPlatform) {
  const GreyImage image = greyPhoto(320, 240, 1);
  EXPECT_EQ(goldenOf(fastVariants[0], image),
            "3365 755 f1fbc8a6d8b6617c a2fe01797c00c4dc 21bdd4cd95b729b8");
  EXPECT_EQ(goldenOf(fastVariants[1], image),
            "2540 668 8fb63d26dcecd2a8 fd5c80a080bbcc3d cf9eda01226eebb8");
  EXPECT_EQ(goldenOf(fastVariants[2], image),
            "2010 581 fe3518a0a7fa9aa6 2081ca88e778d54d 1619d85a92e0d49c");
  EXPECT_EQ(goldenOf(fastVariants[3], image),
            "1560 492 a6a739dcf7e8b05b d2e17782889b0e8d 2fec76fbe17b5c53");
}

}  // namespace
}  // namespace pelorin::test_support
