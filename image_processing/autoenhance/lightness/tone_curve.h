#pragma once

#include <vector>

namespace pelorin::image_processing {

// The tone curves of auto-enhance are sampled curves with one sample a CDF entry that map [0, 1] to
// [0, 1], never decreasing. Pure functions; only std::bad_alloc is thrown.

/// Brightens the mid-tones that hold the faces: moves slope from above the face median to the bins
/// at or below it until `curve[faceBin]` reaches `target`, at most ten rounds. Does nothing when
/// `target` <= 0 or `faceBin` is no bin of the curve.
void updateCurveForFaces(float target, int faceBin, std::vector<float>& curve);

/// Limits the slope of the curve to between `clipLow` and `clipHigh` times the identity's by
/// clamping and renormalising its histogram, `iterations` times. The result runs from 0 to 1; its
/// slope may pass the bounds a little after the last renormalisation. `clipLow` is meant above 0.
void curveMassage(std::vector<float>& curve, float clipLow, float clipHigh, int iterations);

}  // namespace pelorin::image_processing
