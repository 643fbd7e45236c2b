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
    const float t = -1.0f + (x - x0_) * scale_;
    const float a = std::fabs(t);
    const float inner = a0_ + a * (a * (a2_ + a * a3_));
    const float outer = b0_ + a * (b1_ + a * (b2_ + a * b3_));
    // Selected, not branched to, so that loops become vectors. NaN, as in an empty support, is 0.
    const float g = a < 0.5f ? inner : (a < 1.0f ? outer : 0.0f);
    return baseline_ + g * span_;
  }

 private:
  float x0_;
  float baseline_;
  float scale_;
  float span_;
  // The inner cubic starts at 1 with slope 0, the outer one ends at 0 with slope 0; they meet at
  // 1/2 with one value and slope.
  float a0_, a2_, a3_;
  float b0_, b1_, b2_, b3_;
};

}  // namespace pelorin::image_processing
