#pragma once

#include <string>
#include <vector>

#include "image_processing/filters/looks/abstract_rgb_curve_filter.h"

namespace pelorin::image_processing {

/// A look whose curves come from four parameters, "s1" to "s4" of the parameter string: a mean set
/// of curves plus four components, each weighted by one parameter. Parameters lie in [0, 1], values
/// outside are clamped; 0.5, the default, takes no part of the component. No vignette unless the
/// parameters ask for one.
class LowDimRGBCurveFilter : public AbstractRGBCurveFilter<LowDimRGBCurveFilter> {
 public:
  using AbstractRGBCurveFilter::AbstractRGBCurveFilter;

  static FilterParameters parameters();

  /// Appends 11 samples in 0 ... 255, never decreasing, to each curve. With a NaN parameter the
  /// samples are NaN, which the filter draws as 0.
  void getRGBCurves(std::vector<float>& red, std::vector<float>& green, std::vector<float>& blue,
                    const std::string& params) override;
};

}  // namespace pelorin::image_processing
