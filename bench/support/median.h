#pragma once

#include <algorithm>
#include <cstddef>
#include <vector>

namespace pelorin::bench {

/// The middle one; of an even number the lower. There is one at least.
inline double median(std::vector<double> values) {
  const auto middle = values.begin() + (static_cast<std::ptrdiff_t>(values.size()) - 1) / 2;
  std::nth_element(values.begin(), middle, values.end());
  return *middle;
}

}  // namespace pelorin::bench
