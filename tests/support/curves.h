#pragma once

#include <cstddef>
#include <vector>

namespace pelorin::test_support {

/// Equal steps from 0 to 1: a tone curve that changes nothing, and the CDF of even light. As many
/// samples as auto-enhance uses.
inline std::vector<float> identityCurve() {
  constexpr std::size_t samples = 51;
  std::vector<float> curve(samples);
  for (std::size_t i = 0; i < samples; ++i) {
    curve[i] = static_cast<float>(i) / static_cast<float>(samples - 1);
  }
  return curve;
}

/// A CDF whose mass lies at the dark end.
inline std::vector<float> darkCurve() {
  std::vector<float> curve = identityCurve();
  for (float& y : curve) y = y * y;
  return curve;
}

}  // namespace pelorin::test_support
