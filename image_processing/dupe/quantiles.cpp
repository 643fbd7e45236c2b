#include "image_processing/dupe/quantiles.h"

#include <cstddef>

namespace pelorin::image_processing {

void invertScalar(std::span<const float> v, std::span<float> inverse) {
  const std::size_t n = v.size();
  if (n == 0) return;
  const float last = static_cast<float>(n - 1);
  const float step = v[n - 1] / last;
  std::size_t j = 0;
  for (std::size_t i = 0; i + 1 < n; ++i) {
    const float target = static_cast<float>(i) * step;
    while (j < n && v[j] < target) ++j;
    if (j == 0) {
      inverse[i] = 0.0f;
    } else if (j == n) {
      inverse[i] = last;  // never reached: only where `v` ends below 0
    } else {
      const float low = v[j - 1], rise = v[j] - low;
      inverse[i] = rise != 0.0f ? static_cast<float>(j - 1) + (target - low) / rise
                                : static_cast<float>(j) - 0.5f;
    }
  }
  inverse[n - 1] = last;
}

}  // namespace pelorin::image_processing
