#include "image_processing/autoenhance/masks/gaussian_approximation.h"

namespace pelorin::image_processing {

GaussianApproximation<float>::GaussianApproximation(float x0, float x1, float baseline,
                                                    float peak) {
  constexpr float sigma = 0.35355338f;  // √2 / 4
  constexpr float kInFloat = 1.0f / (2.0f * sigma * sigma);
  static_assert(kInFloat == 4.0000005f);
  // The coefficients are formed in double and rounded once: in float the last digits of most move,
  // and with them most of a mask.
  const double k = kInFloat;
  const double e = std::exp(0.25 * k);
  terms_ = {.x0 = x0,
            .baseline = baseline,
            .scale = 2.0f / (x1 - x0),
            .span = peak - baseline,
            .a0 = 1.0f,
            .a2 = -4.6424117f,
            .a3 = static_cast<float>(11.49251253270753 / e),
            .b0 = static_cast<float>((2.0 * k - 4.0) / e),
            .b1 = static_cast<float>(-(8.0 * k - 24.0) / e),
            .b2 = static_cast<float>((10.0 * k - 36.0) / e),
            .b3 = static_cast<float>(-(4.0 * k - 16.0) / e)};
}

}  // namespace pelorin::image_processing
