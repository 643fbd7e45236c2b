#pragma once

#include <string>
#include <vector>

#include "image_processing/filters/filter_parameter.h"

namespace pelorin::image_processing {

// What every look filter reads from its parameter string of "key=value;" items. An item without its
// ";" is not read, unknown keys are ignored, the last of several items with one key counts, and
// text that is no number reads as 0. Any thread may call; only std::bad_alloc is thrown.

/// Replaces the curves named by the keys "r", "g" and "b": numbers in 0 ... 1 over equal steps of
/// the input range, each ended by a comma ("r=0,0.5,1,;"). A list of fewer than 2 numbers is
/// ignored; values outside 0 ... 1 are kept.
void replaceCurves(std::vector<float>& red, std::vector<float>& green, std::vector<float>& blue,
                   const std::string& params);

/// Replaces the values named by "maskRadius", "maskAlpha" and "applyMask" (true when not 0); the
/// others keep what they held.
void replaceMaskSettings(float& maskRadius, float& maskAlpha, bool& applyMask,
                         const std::string& params);

/// The rows of these keys for a look whose vignette is set so until a parameter string changes it.
FilterParameters lookParameters(float maskRadius, float maskAlpha, bool applyMask);

}  // namespace pelorin::image_processing
