#pragma once

#include <cstdint>
#include <limits>
#include <type_traits>

namespace pelorin::image_processing {

/// Converts a float to an integer as the engine's first device does: toward zero, values outside
/// the range of `Integer` become its nearest end, NaN becomes 0. Every conversion of a computed
/// value in the engine goes through here, because a plain cast of such a value is undefined and
/// differs between processors. Never throws.
template <typename Integer, typename Float>
constexpr Integer truncateTo(Float value) {
  static_assert(std::is_integral_v<Integer> && std::is_floating_point_v<Float>);
  using Limits = std::numeric_limits<Integer>;
  // The largest integer may not be a Float, one more always is: a power of two.
  constexpr Float lowest = static_cast<Float>(Limits::min());
  constexpr Integer halfOfIt = Limits::max() / 2 + 1;
  constexpr Float beyondLargest = static_cast<Float>(halfOfIt) * Float(2);
  if (!(value > lowest)) return value <= lowest ? Limits::min() : Integer(0);
  if (value >= beyondLargest) return Limits::max();
  return static_cast<Integer>(value);
}

}  // namespace pelorin::image_processing
