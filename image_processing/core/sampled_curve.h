#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <span>

#include "image_processing/core/float_to_integer.h"

namespace pelorin::image_processing {

// A curve is a sequence of N >= 2 floats: a function sampled at equal steps over its input range.

/// The curve at `x`, interpolated linearly between samples.
/// @param x               input; meant to keep x · samplesPerUnit within [0, maxIndex]. Outside, no
///                        sample but the curve's own is read: inputs beyond an end give about the
///                        end's sample, inputs less than one sample below 0 continue the first
///                        segment.
/// @param curve           at least maxIndex + 1 samples.
/// @param maxIndex        index of the last sample.
/// @param samplesPerUnit  maxIndex over the input range.
/// Never throws; pure.
inline float applyToneCurve(float x, std::span<const float> curve, std::size_t maxIndex,
                            float samplesPerUnit) {
  const float position = x * samplesPerUnit;
  const std::int32_t index = truncateTo<std::int32_t>(position);
  const float fraction = position - static_cast<float>(index);
  const auto sample = [&](std::int64_t at) {
    const auto last = static_cast<std::int64_t>(maxIndex);
    return curve[static_cast<std::size_t>(std::clamp<std::int64_t>(at, 0, last))];
  };
  return fraction * sample(std::int64_t{index} + 1) + (1.0f - fraction) * sample(index);
}

}  // namespace pelorin::image_processing
