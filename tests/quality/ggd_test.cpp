#include "image_processing/quality/ggd.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>

#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

Ggd fitOf(const Image<float>& block) {
  Ggd fit;
  ggdParams(block, fit.shape, fit.left, fit.right);
  return fit;
}

void expectNoFit(const Ggd& fit) {
  EXPECT_TRUE(std::isnan(fit.shape));
  EXPECT_TRUE(std::isnan(fit.left));
  EXPECT_TRUE(std::isnan(fit.right));
  EXPECT_TRUE(std::isnan(ggdMean(fit)));
}

// Values that follow the distribution of `valueAt` at evenly spread ranks in (0, 1), in any order.
template <typename ValueAt>
Image<float> blockOf(const ValueAt& valueAt) {
  Image<float> block(96, 96);
  for (std::size_t i = 0; i < block.pixelCount(); ++i)
    block.data.get()[i] = valueAt((static_cast<float>(i) + 0.5f) / block.pixelCount());
  return block;
}

float laplace(float rank, float scale) {
  return rank < 0.5f ? scale * std::log(2.0f * rank) : -scale * std::log(2.0f * (1.0f - rank));
}

TEST(Ggd, OfAConstantBlockDoesNotExist) {
  Image<float> block(96, 96);
  block.set(0.0f);
  expectNoFit(fitOf(block));
  block.set(-0.0f);
  expectNoFit(fitOf(block));
}

TEST(Ggd, OfValuesOnOneSideDoesNotExist) {
  expectNoFit(fitOf(blockOf([](float rank) { return rank; })));
  expectNoFit(fitOf(blockOf([](float rank) { return -rank; })));
  expectNoFit(fitOf(blockOf([](float rank) { return std::max(0.0f, rank - 0.5f); })));
}

TEST(Ggd, OfNanDoesNotExist) {
  Image<float> block = blockOf([](float rank) { return laplace(rank, 1.0f); });
  block.row(3)[3] = NAN;
  expectNoFit(fitOf(block));
}

TEST(Ggd, OfTwoValuesIsFlatterThanAnyShape) {
  expectNoFit(fitOf(blockOf([](float rank) { return rank < 0.5f ? -1.0f : 1.0f; })));
}

TEST(Ggd, OfAnEmptyBlockDoesNotExist) {
  expectNoFit(fitOf(Image<float>(0, 96)));
}

TEST(Ggd, FindsTheShapeAndScaleOfALaplaceDistribution) {
  const Ggd fit = fitOf(blockOf([](float rank) { return laplace(rank, 0.7f); }));
  EXPECT_NEAR(fit.shape, 1.0f, 0.01f);
  EXPECT_NEAR(fit.left, 0.7f, 0.01f);
  EXPECT_NEAR(fit.right, 0.7f, 0.01f);
  EXPECT_NEAR(ggdMean(fit), 0.0f, 1e-3f);
}

TEST(Ggd, FindsTheShapeOfANormalDistribution) {
  test_support::Random random(1);
  const Ggd fit = fitOf(blockOf([&](float rank) {  // Box and Muller's method
    return std::sqrt(-2.0f * std::log(rank)) * std::cos(6.2831853f * random.nextFloat());
  }));
  EXPECT_NEAR(fit.shape, 2.0f, 0.15f);
  EXPECT_NEAR(fit.left, std::sqrt(2.0f), 0.06f);
  EXPECT_NEAR(fit.right, std::sqrt(2.0f), 0.06f);
}

TEST(Ggd, TellsTheSidesApart) {
  const Ggd fit =
      fitOf(blockOf([](float rank) { return laplace(rank, rank < 0.5f ? 0.2f : 0.3f); }));
  EXPECT_NEAR(fit.right / fit.left, 1.5f, 1e-3f);
  EXPECT_NEAR(fit.shape, 1.0f, 0.1f);
  EXPECT_GT(ggdMean(fit), 0.0f);
}

TEST(Ggd, ZerosCountInTheMeansOnly) {
  const Image<float> block = blockOf([](float rank) { return laplace(rank, 1.0f); });
  Image<float> withZeros(96, 192);
  withZeros.set(0.0f);
  std::copy_n(block.data.get(), block.pixelCount(), withZeros.data.get());
  const Ggd fit = fitOf(block), spiky = fitOf(withZeros);
  EXPECT_LT(spiky.shape, fit.shape);
  EXPECT_GT(spiky.left, 0.0f);
}

TEST(Ggd, CountsEachSideByItself) {
  Image<float> block(6, 1);
  const float values[] = {-4.0f, -1.0f, 0.0f, 1.0f, 2.0f, 2.0f};
  std::copy_n(values, 6, block.data.get());
  const Ggd fit = fitOf(block);
  ASSERT_FALSE(std::isnan(fit.shape));
  // Mean squares of 17 / 2 and 9 / 3.
  EXPECT_NEAR(fit.left / fit.right, std::sqrt(17.0f / 6.0f), 1e-6f);
}

TEST(GgdMean, AboveThreeTenthsDoesNotExist) {
  // At shape 1 the factor is close to 1: the mean is the difference of the scales.
  const float inside = ggdMean({1.0f, 0.5f, 0.79f});
  EXPECT_NEAR(inside, 0.29f, 0.005f);
  EXPECT_TRUE(std::isnan(ggdMean({1.0f, 0.5f, 0.82f})));
  EXPECT_TRUE(std::isnan(ggdMean({1.0f, 0.82f, 0.5f})));
  EXPECT_EQ(ggdMean({1.0f, 0.79f, 0.5f}), -inside);
}

TEST(GgdMean, NeedsATabulatedShape) {
  EXPECT_TRUE(std::isnan(ggdMean({0.09f, 0.5f, 0.5f})));
  EXPECT_TRUE(std::isnan(ggdMean({11.1f, 0.5f, 0.5f})));
  EXPECT_TRUE(std::isnan(ggdMean({NAN, 0.5f, 0.5f})));
}

}  // namespace
}  // namespace pelorin::image_processing
