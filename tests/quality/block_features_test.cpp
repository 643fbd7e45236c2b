#include "image_processing/quality/block_features.h"

#include <gtest/gtest.h>

#include <cmath>

#include "image_processing/quality/ggd.h"
#include "tests/quality/float_images.h"
#include "tests/support/instruction_sets.h"

namespace pelorin::image_processing {
namespace {

using test_support::coefficients;
using test_support::onEveryInstructionSet;
using test_support::sameBytes;

Image<float> featuresOf(const Image<float>& structure, std::uint32_t columns, std::uint32_t rows,
                        std::uint32_t scale = 0) {
  Image<float> features(columns * rows, 18 * (scale + 1));
  features.set(-7.0f);
  computeBlockFeatures(structure, niqeFeaturesPerScale, niqeBlockSize, columns, rows, scale,
                       features);
  return features;
}

TEST(BuildBlock, CopiesWithoutAShift) {
  const Image<float> structure = coefficients(20, 20, 1);
  Image<float> block(4, 6);
  buildBlock(structure, 5, 7, 0, 0, block);
  for (std::uint32_t j = 0; j < 6; ++j)
    for (std::uint32_t i = 0; i < 4; ++i) EXPECT_EQ(block.row(j)[i], structure.row(7 + j)[5 + i]);
}

TEST(BuildBlock, NeighbourProductsWrapInsideTheBlock) {
  const Image<float> structure = coefficients(20, 20, 2);
  Image<float> block(4, 4);
  const auto at = [&](std::uint32_t x, std::uint32_t y) { return structure.row(8 + y)[8 + x]; };
  buildBlock(structure, 8, 8, 0, 1, block);
  EXPECT_EQ(block.row(2)[0], at(0, 2) * at(3, 2));  // not the pixel left of the block
  EXPECT_EQ(block.row(2)[1], at(1, 2) * at(0, 2));
  buildBlock(structure, 8, 8, 1, 0, block);
  EXPECT_EQ(block.row(0)[2], at(2, 0) * at(2, 3));
  buildBlock(structure, 8, 8, 1, 1, block);
  EXPECT_EQ(block.row(0)[0], at(0, 0) * at(3, 3));
  buildBlock(structure, 8, 8, 1, -1, block);
  EXPECT_EQ(block.row(0)[3], at(3, 0) * at(0, 3));
  EXPECT_EQ(block.row(1)[1], at(1, 1) * at(2, 0));
}

TEST(BuildBlock, IsNanWhenTheBlockReachesPastTheImage) {
  const Image<float> structure = coefficients(20, 20, 3);
  Image<float> block(4, 4);
  for (const auto& [x0, y0] : {std::pair{17u, 0u}, {0u, 17u}, {0xFFFFFFFFu, 0u}}) {
    buildBlock(structure, x0, y0, 1, 1, block);
    for (std::size_t i = 0; i < 16; ++i) EXPECT_TRUE(std::isnan(block.data.get()[i]));
  }
  buildBlock(structure, 16, 16, 0, 0, block);
  EXPECT_EQ(block.row(3)[3], structure.row(19)[19]);
}

TEST(BlockFeatures, OfAConstantBlockAreAllNan) {
  Image<float> structure(96, 96);
  structure.set(0.0f);
  const Image<float> features = featuresOf(structure, 1, 1);
  for (std::size_t i = 0; i < 18; ++i) EXPECT_TRUE(std::isnan(features.data.get()[i])) << i;
}

TEST(BlockFeatures, OfAllPositiveCoefficientsAreNan) {
  Image<float> structure = coefficients(96, 96, 4);
  for (std::size_t i = 0; i < structure.pixelCount(); ++i)
    structure.data.get()[i] = std::fabs(structure.data.get()[i]) + 0.01f;
  const Image<float> features = featuresOf(structure, 1, 1);
  for (std::size_t i = 0; i < 18; ++i) EXPECT_TRUE(std::isnan(features.data.get()[i])) << i;
}

TEST(BlockFeatures, AreTheFitsOfTheBlockAndItsFourProducts) {
  const Image<float> structure = coefficients(192, 96, 5);
  const Image<float> features = featuresOf(structure, 2, 1);
  Image<float> block(96, 96);
  Ggd fit;
  const auto fitOf = [&](int dy, int dx) {
    buildBlock(structure, 96, 0, dy, dx, block);
    ggdParams(block, fit.shape, fit.left, fit.right);
  };
  fitOf(0, 0);
  EXPECT_EQ(features.row(0)[1], fit.shape);
  EXPECT_EQ(features.row(1)[1], (fit.left + fit.right) * 0.5f);
  std::uint32_t row = 2;
  for (const auto& [dy, dx] : {std::pair{0, 1}, {1, 0}, {1, 1}, {1, -1}}) {
    fitOf(dy, dx);
    EXPECT_EQ(features.row(row)[1], fit.shape);
    EXPECT_EQ(features.row(row + 1)[1], ggdMean(fit));
    EXPECT_EQ(features.row(row + 2)[1], fit.left);
    EXPECT_EQ(features.row(row + 3)[1], fit.right);
    row += 4;
  }
  EXPECT_EQ(row, 18u);
}

TEST(BlockFeatures, NumberBlocksRowByRow) {
  Image<float> structure(288, 192);
  structure.set(0.0f);
  const Image<float> noise = coefficients(96, 96, 6);
  for (std::uint32_t y = 0; y < 96; ++y)  // the middle block of the lower row
    std::copy_n(noise.row(y), 96, structure.row(96 + y) + 96);
  const Image<float> features = featuresOf(structure, 3, 2);
  for (std::uint32_t k = 0; k < 6; ++k) EXPECT_EQ(std::isnan(features.row(0)[k]), k != 4) << k;
}

TEST(BlockFeatures, OfTheSecondScaleUseSmallerBlocksAndTheirOwnRows) {
  const Image<float> structure = coefficients(96, 96, 7);
  const Image<float> features = featuresOf(structure, 2, 2, 1);
  for (std::uint32_t row = 0; row < 18; ++row) EXPECT_EQ(features.row(row)[0], -7.0f);
  Image<float> block(48, 48);
  buildBlock(structure, 48, 48, 0, 0, block);
  Ggd fit;
  ggdParams(block, fit.shape, fit.left, fit.right);
  EXPECT_EQ(features.row(18)[3], fit.shape);
}

TEST(BlockFeatures, OfABlockThatReachesPastTheImageAreNan) {
  onEveryInstructionSet([] {
    const Image<float> structure = coefficients(150, 96, 8);
    const Image<float> features = featuresOf(structure, 2, 1);
    EXPECT_FALSE(std::isnan(features.row(0)[0]));
    for (std::uint32_t row = 0; row < 18; ++row) EXPECT_TRUE(std::isnan(features.row(row)[1]));
  });
}

TEST(BlockFeatures, MatchTheirDefinitionByteForByteOnEveryInstructionSet) {
  onEveryInstructionSet([] {
    for (std::uint32_t count = 1; count <= 35; ++count) {
      // Small blocks of every size, in grids that leave spare lanes.
      const std::uint32_t side = 1 + count % 13, columns = 1 + count % 7,
                          rows = count / columns + 1;
      const Image<float> structure = coefficients(side * columns + 2, side * rows + 1, count);
      Image<float> expected(columns * rows, 36), actual(columns * rows, 36);
      expected.set(-7.0f);
      actual.set(-7.0f);
      computeBlockFeaturesScalar(structure, 18, 2 * side, columns, rows, 1, expected);
      computeBlockFeatures(structure, 18, 2 * side, columns, rows, 1, actual);
      ASSERT_TRUE(sameBytes(actual.data.get(), expected.data.get(), actual.pixelCount()))
          << columns << " x " << rows << " blocks of " << side;
    }
  });
}

}  // namespace
}  // namespace pelorin::image_processing
