#pragma once

#include <array>
#include <cstddef>

namespace pelorin::image_processing {

// What pristine photos look like to the score: mean and inverse covariance of their 36 features,
// after the pristine model of Mittal, Soundararajan and Bovik, "Making a Completely Blind Image
// Quality Analyzer" (2013). Frozen; NiqeModel.KeepsEveryBit notices a slip.

constexpr std::size_t niqeFeatureCount = 36;
constexpr std::size_t niqePackedPrecisionCount = niqeFeatureCount * (niqeFeatureCount + 1) / 2;

/// Indexed like the rows of the feature image: 18 features of the picture, 18 of its half.
extern const std::array<float, niqeFeatureCount> niqeModelMean;

/// The upper triangle of the symmetric inverse covariance, row after row, each from its diagonal.
extern const std::array<float, niqePackedPrecisionCount> niqeModelPrecision;

}  // namespace pelorin::image_processing
