#include "image_processing/quality/quality_score.h"

#include <array>
#include <cmath>
#include <limits>

#include "image_processing/quality/niqe_model.h"

namespace pelorin::image_processing {
namespace {

Image<float> expandedPrecision() {
  Image<float> precision(niqeFeatureCount, niqeFeatureCount);
  const float* packed = niqeModelPrecision.data();
  for (std::uint32_t i = 0; i < niqeFeatureCount; ++i)
    for (std::uint32_t j = i; j < niqeFeatureCount; ++j)
      precision.row(i)[j] = precision.row(j)[i] = *packed++;
  return precision;
}

}  // namespace

void mean(const Image<float>& features, std::vector<float>& means) {
  means.clear();
  for (std::uint32_t row = 0; row < features.height; ++row) {
    float sum = 0.0f;
    std::uint32_t count = 0;
    for (std::uint32_t column = 0; column < features.width; ++column) {
      const float value = features.row(row)[column];
      if (std::isnan(value)) continue;
      sum += value;
      ++count;
    }
    means.push_back(count == 0 ? 0.0f : sum / static_cast<float>(count));
  }
}

float computeQuality(const std::vector<float>& meanFeatures) {
  if (meanFeatures.size() != niqeFeatureCount) return std::numeric_limits<float>::quiet_NaN();
  const Image<float> precision = expandedPrecision();
  std::array<float, niqeFeatureCount> difference;
  for (std::size_t i = 0; i < niqeFeatureCount; ++i)
    difference[i] = niqeModelMean[i] - meanFeatures[i];

  float form = 0.0f;
  for (std::uint32_t i = 0; i < niqeFeatureCount; ++i)
    for (std::uint32_t j = 0; j < niqeFeatureCount; ++j)
      form += (precision.row(i)[j] * difference[j]) * difference[i];
  return std::sqrt(form);
}

}  // namespace pelorin::image_processing
