#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <span>
#include <vector>

#include "image_processing/core/float_to_integer.h"

namespace pelorin::image_processing {

// A tone curve is a sequence of N >= 2 floats sampled at equal steps over the input range. The
// curves built here have one sample a CDF entry and map [0, 1] to [0, 1], never decreasing. Pure
// functions; only std::bad_alloc is thrown.

/// The curve at `x`, interpolated linearly between samples.
/// @param x               input; meant to keep x · samplesPerUnit within [0, maxIndex]. Outside, no
///                        sample but the curve's own is read: inputs beyond an end give about the
///                        end's sample, inputs less than one sample below 0 continue the first
///                        segment.
/// @param curve           at least maxIndex + 1 samples.
/// @param maxIndex        index of the last sample.
/// @param samplesPerUnit  maxIndex over the input range.
inline float applyToneCurve(float x, std::span<const float> curve, std::size_t maxIndex,
                            float samplesPerUnit) {
  const float position = x * samplesPerUnit;
  const std::int32_t index = truncateTo<std::int32_t>(position);
  const float fraction = position - static_cast<float>(index);
  const std::int64_t last = static_cast<std::int64_t>(maxIndex);
  const std::int64_t lower = std::clamp<std::int64_t>(index, 0, last);
  const std::int64_t upper = std::clamp<std::int64_t>(std::int64_t{index} + 1, 0, last);
  return fraction * curve[upper] + (1.0f - fraction) * curve[lower];
}

/// Brightens the mid-tones that hold the faces: moves slope from above the face median to the bins
/// at or below it until `curve[faceBin]` reaches `target`, at most ten rounds. Does nothing when
/// `target` <= 0 or `faceBin` is no bin of the curve.
void updateCurveForFaces(float target, int faceBin, std::vector<float>& curve);

/// Limits the slope of the curve to between `clipLow` and `clipHigh` times the identity's by
/// clamping and renormalising its histogram, `iterations` times. The result runs from 0 to 1; its
/// slope may pass the bounds a little after the last renormalisation. `clipLow` is meant above 0.
void curveMassage(std::vector<float>& curve, float clipLow, float clipHigh, int iterations);

}  // namespace pelorin::image_processing
