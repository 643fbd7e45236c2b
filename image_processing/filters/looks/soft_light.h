#pragma once

#include <cmath>

namespace pelorin::image_processing {

/// The constants of the blend of a channel value x with a mask m. Up to m = 1/2 the strength of the
/// darkening is 1/255 - m 2/255; above, the lightest result is a cubic of x in the darkest quarter
/// of the values and a multiple of the root, sqrt(255), from there on.
namespace soft_light {
inline constexpr float strength = 0.003921569f, strengthPerMask = 0.007843138f;
inline constexpr float cubic3 = 0.0002460592f, cubic2 = 0.047058824f, cubic1 = 4.0f;
inline constexpr float quarter = 63.75f, rootGain = 15.9687195f;
}  // namespace soft_light

/// Soft-light blend of a channel value with a mask: 0.5 leaves the value as it is, smaller masks
/// darken and larger ones lighten, black and white stay.
/// @param x     channel value, 0 ... 255; the result has the same unit and is not rounded.
/// @param mask  0 ... 1.
inline float softLight(float x, float mask) {
  using namespace soft_light;
  if (mask <= 0.5f) return x - (strength - mask * strengthPerMask) * x * (255.0f - x);
  const float lightened =
      x <= quarter ? ((cubic3 * x - cubic2) * x + cubic1) * x : rootGain * std::sqrt(x);
  return x + (2.0f * mask - 1.0f) * (lightened - x);
}

/// The channel value after a vignette of this opacity: the soft-light blend over the value itself.
inline float vignetteChannel(float x, float mask, float opacity) {
  return opacity * softLight(x, mask) + (1.0f - opacity) * x;
}

}  // namespace pelorin::image_processing
