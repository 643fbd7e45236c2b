#include "image_processing/quality/ggd.h"

#include <cmath>
#include <limits>

#include "image_processing/quality/niqe_tables.h"

namespace pelorin::image_processing {
namespace {

constexpr float nan = std::numeric_limits<float>::quiet_NaN();

BlockSums sumBlock(const Image<float>& block) {
  BlockSums sums;
  for (std::size_t i = 0; i < block.pixelCount(); ++i) {
    const float x = block.data.get()[i];
    const float square = x * x;
    sums.absolute += std::fabs(x);
    sums.squares += square;
    if (x < 0.0f) {
      sums.leftSquares += square;
      ++sums.left;
    } else if (x > 0.0f) {
      sums.rightSquares += square;
      ++sums.right;
    }
  }
  return sums;
}

}  // namespace

Ggd fitGgd(const BlockSums& sums, float count) {
  constexpr Ggd noFit = {nan, nan, nan};
  if (sums.left == 0 || sums.right == 0) return noFit;

  const float leftDeviation = std::sqrt(sums.leftSquares / static_cast<float>(sums.left));
  const float rightDeviation = std::sqrt(sums.rightSquares / static_cast<float>(sums.right));
  const float g = leftDeviation / rightDeviation;
  const float g2 = g * g;
  const float g3 = g2 * g;
  const float g4 = g2 * g2;
  const float mean = sums.absolute / count;
  const float ratio =
      mean * mean / (sums.squares / count) * (((g4 + g3) + g) + 1.0f) / ((g4 + (g2 + g2)) + 1.0f);
  if (!(ratio >= smallestRatio && ratio <= largestRatio)) return noFit;

  const float shape = shapeFromRatio(ratio);
  if (!isTabulatedShape(shape)) return {shape, nan, nan};
  const float factor = scaleFactor(shape);
  return {shape, leftDeviation * factor, rightDeviation * factor};
}

float ggdMean(const Ggd& fit) {
  if (!isTabulatedShape(fit.shape)) return nan;
  const double factor = std::pow(10.0, static_cast<double>(meanFactor(fit.shape)));
  const float mean = static_cast<float>(static_cast<double>(fit.right - fit.left) * factor);
  return std::fabs(static_cast<double>(mean)) > 0.3 ? nan : mean;
}

void ggdParams(const Image<float>& block, float& shape, float& leftScale, float& rightScale) {
  const Ggd fit = fitGgd(sumBlock(block), static_cast<float>(block.pixelCount()));
  shape = fit.shape;
  leftScale = fit.left;
  rightScale = fit.right;
}

}  // namespace pelorin::image_processing
