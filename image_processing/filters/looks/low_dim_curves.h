#pragma once

#include <array>

namespace pelorin::image_processing {

/// Red, green and blue part of one term of the four-parameter curve model, in units of the full
/// output range. Sample i belongs to the input 25.5·i, the last one to 255.
using LowDimCurves = std::array<std::array<float, 11>, 3>;

// The mild curves the model starts from, and the four directions it can move them in. Checked by
// LowDimCurves.HaveTheirEndsAndSums.
extern const LowDimCurves lowDimMean;
extern const LowDimCurves lowDimComponent1;
extern const LowDimCurves lowDimComponent2;
extern const LowDimCurves lowDimComponent3;
extern const LowDimCurves lowDimComponent4;

}  // namespace pelorin::image_processing
