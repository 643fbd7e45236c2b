#pragma once

#include <vector>

#include "image_processing/core/export.h"
#include "image_processing/core/image.h"

namespace pelorin::image_processing {

/// The mean of each row of the feature image over the values that are not NaN, summed from left to
/// right; 0 for a row without any.
/// @param means  replaced; one entry a row.
/// @throws std::bad_alloc. Pure.
PELORIN_EXPORT void mean(const Image<float>& features, std::vector<float>& means);

/// How far features are from those of pristine photos: the square root of the model's quadratic
/// form of the difference. 0 or above, lower is better, in no unit; NaN when rounding makes the
/// form negative.
/// @param meanFeatures  36 features; NaN is the answer for any other number.
/// @throws std::bad_alloc. Pure.
PELORIN_EXPORT float computeQuality(const std::vector<float>& meanFeatures);

}  // namespace pelorin::image_processing
