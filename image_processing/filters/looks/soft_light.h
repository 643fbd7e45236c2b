#pragma once

#include <cmath>

namespace pelorin::image_processing {

/// Soft-light blend of a channel value with a mask: 0.5 leaves the value as it is, smaller masks
/// darken and larger ones lighten, black and white stay.
/// @param x     channel value, 0 ... 255; the result has the same unit and is not rounded.
/// @param mask  0 ... 1.
inline float softLight(float x, float mask) {
  if (mask <= 0.5f) return x - (0.003921569f - mask * 0.007843138f) * x * (255.0f - x);
  const float lightened = x <= 63.75f ? ((0.0002460592f * x - 0.047058824f) * x + 4.0f) * x
                                      : 15.9687195f * std::sqrt(x);
  return x + (2.0f * mask - 1.0f) * (lightened - x);
}

/// The channel value after a vignette of this opacity: the soft-light blend over the value itself.
inline float vignetteChannel(float x, float mask, float opacity) {
  return opacity * softLight(x, mask) + (1.0f - opacity) * x;
}

}  // namespace pelorin::image_processing
