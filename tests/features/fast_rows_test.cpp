#include "image_processing/features/fast_rows.h"

#include <gtest/gtest.h>

#include <vector>

#include "tests/support/grey_pictures.h"
#include "tests/support/instruction_sets.h"

namespace pelorin::image_processing {
namespace {

using test_support::GreyImage;
using test_support::onEveryInstructionSet;
using Scores = std::vector<std::uint8_t>;

constexpr std::uint8_t untouched = 77;

// Rows are worked off in pieces of 64 vectors: around one, two and more of them on every set.
constexpr std::uint32_t wideRows[] = {1029, 1030, 1031, 1046, 1047, 1062, 2053, 2054, 2055, 2087,
                                      4101, 4102, 4103, 4165, 4166, 4167, 8198, 8199, 8300};

// `scorer` over the middle row of seven, with columns to spare on either side.
template <typename Scorer>
Scores scoresBy(Scorer scorer, const GreyImage& image, bool upward, int arc, int threshold,
                bool& any) {
  Scores scores(image.width, untouched);
  const std::ptrdiff_t stride = image.width;
  any = scorer(image.row(3), upward ? -stride : stride, 3, image.width - 3, arc, threshold,
               scores.data());
  return scores;
}

void expectSameScores(const GreyImage& image, int arc, int threshold) {
  for (const bool upward : {false, true}) {
    bool expectedAny = false, actualAny = false;
    const Scores expected =
        scoresBy(fastScoreRowScalar, image, upward, arc, threshold, expectedAny);
    const Scores actual = scoresBy(fastScoreRow, image, upward, arc, threshold, actualAny);
    ASSERT_EQ(expected, actual) << image.width << " wide, " << arc << " of 16 at " << threshold;
    ASSERT_EQ(expectedAny, actualAny);
  }
}

TEST(FastScoreRow, EqualsTheScalarDefinitionOnEveryInstructionSetAtEveryWidth) {
  onEveryInstructionSet([] {
    for (std::uint32_t width = 7; width <= 150; ++width) {
      const int arc = 9 + static_cast<int>(width % 4);
      expectSameScores(test_support::greyNoise(width, 7, width), arc, 10);
      expectSameScores(test_support::greyPhoto(width, 7, width), arc, 10);
    }
  });
}

TEST(FastScoreRow, EqualsTheScalarDefinitionOnEveryInstructionSetInWideRows) {
  onEveryInstructionSet([] {
    for (const std::uint32_t width : wideRows) {
      expectSameScores(test_support::greyNoise(width, 7, width), 9, 60);
      expectSameScores(test_support::greyPhoto(width, 7, width), 9, 10);
    }
  });
}

// Long bright and dark arcs at every contrast, so that all arcs and scores up to 255 occur.
GreyImage blots(std::uint32_t width, std::uint64_t seed) {
  test_support::Random random(seed);
  GreyImage image(width, 7);
  for (std::uint32_t x = 0; x < width; ++x) {
    const bool extreme = random.below(4) == 0;
    const std::uint8_t column = static_cast<std::uint8_t>(random.below(2) * 255);
    for (std::uint32_t y = 0; y < 7; ++y) {
      image.row(y)[x] = extreme ? column : static_cast<std::uint8_t>(random.below(256));
    }
    if (random.below(3) == 0) {
      image.row(3)[x] = static_cast<std::uint8_t>(random.below(2) * 255);
    }
  }
  return image;
}

TEST(FastScoreRow, EqualsTheScalarDefinitionOnEveryInstructionSetAtEveryThreshold) {
  onEveryInstructionSet([] {
    for (const int arc : {9, 10, 11, 12}) {
      for (int threshold = 0; threshold <= 254; ++threshold) {
        expectSameScores(blots(300, threshold), arc, threshold);
      }
    }
  });
}

TEST(FastScoreRow, ScoresSolitaryPixelsOfEveryContrast) {
  onEveryInstructionSet([] {
    for (int difference = 1; difference <= 255; ++difference) {
      GreyImage image = test_support::greyFlat(90, 7, 0);
      image.row(3)[45] = static_cast<std::uint8_t>(difference);
      Scores scores(90, 0);
      ASSERT_EQ(fastScoreRow(image.row(3), 90, 3, 87, 12, 20, scores.data()), difference > 20);
      // Corner up to a threshold of difference - 1; the map holds one more.
      ASSERT_EQ(scores[45], difference > 20 ? difference : 0);
    }
  });
}

// Maps with many zeros, whole stretches of them if sparse, ties and steps of one.
Scores someScores(std::size_t width, std::uint64_t seed, bool sparse = false) {
  test_support::Random random(seed);
  Scores scores(width);
  for (std::uint8_t& score : scores) {
    const bool corner = random.below(sparse ? 80 : 3) == 0;
    score = corner ? static_cast<std::uint8_t>(250 + random.below(6)) : 0;
  }
  return scores;
}

TEST(FastListCorners, EqualsTheScalarDefinitionOnEveryInstructionSet) {
  onEveryInstructionSet([] {
    for (std::size_t width = 7; width <= 200; ++width) {
      const Scores scores = someScores(width, width);
      std::vector<xy> expected(width, {-1, -1}), actual = expected;
      const std::size_t count =
          fastListCornersScalar(scores.data(), 3, width - 3, 5, expected.data());
      ASSERT_EQ(fastListCorners(scores.data(), 3, width - 3, 5, actual.data()), count);
      ASSERT_EQ(actual, expected) << width;
    }
  });
}

void expectSameMaxima(std::size_t width, bool sparse) {
  const Scores above = someScores(width, width, sparse),
               scores = someScores(width, width + 1000, sparse),
               below = someScores(width, width + 2000, sparse);
  std::vector<xy> expected(width, {-1, -1}), actual = expected;
  const std::size_t count = fastListMaximaScalar(above.data(), scores.data(), below.data(), 3,
                                                 width - 3, 5, expected.data());
  ASSERT_EQ(
      fastListMaxima(above.data(), scores.data(), below.data(), 3, width - 3, 5, actual.data()),
      count);
  ASSERT_EQ(actual, expected) << width;
}

TEST(FastListMaxima, EqualsTheScalarDefinitionOnEveryInstructionSet) {
  onEveryInstructionSet([] {
    for (std::size_t width = 7; width <= 200; ++width) expectSameMaxima(width, false);
  });
}

TEST(FastListMaxima, EqualsTheScalarDefinitionOnEveryInstructionSetInWideRows) {
  onEveryInstructionSet([] {
    for (const std::uint32_t width : wideRows) {
      expectSameMaxima(width, false);
      expectSameMaxima(width, true);
    }
  });
}

}  // namespace
}  // namespace pelorin::image_processing
