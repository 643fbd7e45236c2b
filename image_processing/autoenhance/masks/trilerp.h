#pragma once

namespace pelorin::image_processing {

/// Linear interpolation: (1 - t) · a + t · b, not clamped.
template <typename T>
constexpr T lerp(T t, T a, T b) {
  return (T(1) - t) * a + t * b;
}

/// Trilinear interpolation of corner values v(i, j, k), i along y, j along x, k along the bin:
/// along y first, then x, then the bin. Fractions outside [0, 1] extrapolate.
template <typename T>
constexpr T trilerp(T v000, T v100, T v010, T v110, T v001, T v101, T v011, T v111, T ty, T tx,
                    T tb) {
  return lerp(tb, lerp(tx, lerp(ty, v000, v100), lerp(ty, v010, v110)),
              lerp(tx, lerp(ty, v001, v101), lerp(ty, v011, v111)));
}

}  // namespace pelorin::image_processing
