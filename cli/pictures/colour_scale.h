#pragma once

#include <vector>

#include "cli/pictures/canvas.h"

namespace pelorin::cli {

/// What colour stands for what value: blue for the low end, red for the high end, pale yellow
/// between.
struct ColourScale {
  double low, high;  ///< Both finite, `low` below `high`.

  /// Values beyond the ends have the colours of the ends; `value` is not NaN.
  Colour operator()(double value) const;
};

/// The scale from the least to the greatest of the values, NaN and infinities left out. A single
/// value lies in the middle of a scale one wide; without any the scale is 0 ... 1.
ColourScale scaleAcross(const std::vector<float>& values);

}  // namespace pelorin::cli
