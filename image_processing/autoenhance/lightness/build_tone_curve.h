#pragma once

#include <vector>

#include "image_processing/autoenhance/lightness/image_statistics.h"
#include "image_processing/filters/filter_config.h"

namespace pelorin::image_processing {

/// The tone curve of a photo at the configuration's slider: a partial equalisation (the identity
/// mixed with the CDF), lifted for faces, then limited in slope. One sample a CDF entry, [0, 1] to
/// [0, 1]. May throw std::bad_alloc; keeps no state.
std::vector<float> buildToneCurve(const ImageStatistics& statistics, const FilterConfig& config);

}  // namespace pelorin::image_processing
