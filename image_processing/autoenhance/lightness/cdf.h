#pragma once

#include <vector>

namespace pelorin::image_processing {

/// The running sum of `histogram`, starting at 0: one entry more than the histogram has. Sums are
/// formed left to right in float.
void computeCDF(const std::vector<float>& histogram, std::vector<float>& cdf);

/// The differences of consecutive entries of `cdf` (at least one entry).
void computeHistogramFromCDF(const std::vector<float>& cdf, std::vector<float>& histogram);

}  // namespace pelorin::image_processing
