#pragma once

#include <cstdint>

namespace pelorin::image_processing {

/// Where the coordinates of a vignette start and how they grow from pixel centre to pixel centre:
/// 0 in the middle of the picture, 1 at `maskRadius` halves of its height, on both axes. They are
/// meant to be advanced by adding `step` once a pixel, and the rounding of those additions is part
/// of the result.
struct VignetteCoordinates {
  VignetteCoordinates(std::uint32_t width, std::uint32_t height, float maskRadius)
      : step(1.0f / (static_cast<float>(height) * 0.5f * maskRadius)),
        firstU((0.5f - static_cast<float>(width) * 0.5f) * step),
        firstV((0.5f - static_cast<float>(height) * 0.5f) * step) {}

  float step;    ///< Not finite for a mask radius of 0 or NaN.
  float firstU;  ///< At column 0.
  float firstV;  ///< At row 0.
};

}  // namespace pelorin::image_processing
