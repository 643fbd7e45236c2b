#pragma once

#include <cstdint>

#include "image_processing/core/float_to_integer.h"
#include "image_processing/core/image_metadata.h"

namespace pelorin::image_processing {

/// A face box as fractions of the upright picture; may lie outside it.
struct FaceFractions {
  float left, top, right, bottom;
};

/// The box in pixels: fraction times the side's length in float, truncated toward zero, with no
/// clamping; NaN is 0.
inline BoundingBox boxInPixels(const FaceFractions& face, float columns, float rows) {
  return {.left = truncateTo<std::int32_t>(face.left * columns),
          .right = truncateTo<std::int32_t>(face.right * columns),
          .bottom = truncateTo<std::int32_t>(face.bottom * rows),
          .top = truncateTo<std::int32_t>(face.top * rows)};
}

}  // namespace pelorin::image_processing
