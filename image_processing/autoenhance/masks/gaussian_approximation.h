#pragma once

#include <cmath>

namespace pelorin::image_processing {

template <typename T>
class GaussianApproximation;

/// A piecewise cubic stand-in for a Gaussian bell over [x0, x1]: `peak` in the middle, `baseline`
/// at the ends and beyond, near exp(-4 t²) with t from -1 to 1. No exponential is evaluated per
/// look-up. Immutable, so any thread may look up.
template <>
class GaussianApproximation<float> {
 public:
  /// An empty support (x0 = x1) weighs `baseline` everywhere.
  GaussianApproximation(float x0, float x1, float baseline, float peak);

  float operator()(float x) const {
    const float t = -1.0f + (x - terms_.x0) * terms_.scale;
    const float a = std::fabs(t);
    const float inner = terms_.a0 + a * (a * (terms_.a2 + a * terms_.a3));
    const float outer = terms_.b0 + a * (terms_.b1 + a * (terms_.b2 + a * terms_.b3));
    // NaN, as in an empty support, is 0.
    const float g = a < 0.5f ? inner : (a < 1.0f ? outer : 0.0f);
    return terms_.baseline + g * terms_.span;
  }

  /// What the bell is made of, for those who form it in vectors.
  struct Terms {
    float x0, baseline, scale, span;
    // The inner cubic starts at 1 with slope 0, the outer one ends at 0 with slope 0; they meet at
    // 1/2 with one value and slope.
    float a0, a2, a3;
    float b0, b1, b2, b3;
  };
  const Terms& terms() const { return terms_; }

 private:
  Terms terms_;
};

}  // namespace pelorin::image_processing
