#pragma once

#include <algorithm>

namespace pelorin::image_processing {

/// Mirrors an index at the ends of [0, n); one far outside may still be outside.
template <typename Integer>
constexpr Integer reflect(Integer i, Integer n) {
  return i < 0 ? -i : i < n ? i : 2 * n - 1 - i;
}

/// `reflect`, then held to [0, n - 1]; n at least 1.
template <typename Integer>
constexpr Integer reflectInto(Integer i, Integer n) {
  return std::clamp<Integer>(reflect(i, n), 0, n - 1);
}

}  // namespace pelorin::image_processing
