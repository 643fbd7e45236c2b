#pragma once

#include <array>

namespace pelorin::image_processing {

/// Red, green and blue tone curve of a look. Sample i is the output, 0 ... 255, for the input 5·i,
/// the last one for 255; between them the curve is linear.
using LookCurves = std::array<std::array<float, 52>, 3>;

// Data of the look filters, whole numbers. Checked by LookCurves.HaveTheirEndsAndSums.
extern const LookCurves zebraBWCurves;
extern const LookCurves winterCurves;
extern const LookCurves springCurves;
extern const LookCurves fallCurves;
extern const LookCurves summerCurves;
extern const LookCurves vintageCurves;

}  // namespace pelorin::image_processing
