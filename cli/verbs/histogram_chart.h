#pragma once

#include <string>
#include <vector>

namespace pelorin::cli {

/// A bar chart for a terminal: one column a bin, the tallest bin `rows` high, bins that hold
/// anything at least a dot; then an axis. Every line begins with `indent`.
std::string histogramChart(const std::vector<float>& histogram, int rows,
                           const std::string& indent);

}  // namespace pelorin::cli
