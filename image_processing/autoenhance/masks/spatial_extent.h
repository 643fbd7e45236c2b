#pragma once

#include <algorithm>
#include <cstdint>

#include "image_processing/filters/filter_config.h"

namespace pelorin::image_processing {

/// How far the bilateral mask of a photo of this size smooths, in pixels, at least 1.
inline float spatialExtent(std::uint32_t width, std::uint32_t height, const FilterConfig& config) {
  const float shorterSide = static_cast<float>(std::min(width, height));
  const float extent = shorterSide * config.bilateralSpatialFraction;
  return extent > 1.0f ? extent : 1.0f;
}

}  // namespace pelorin::image_processing
