#pragma once

#include <algorithm>
#include <array>
#include <cstdint>

#include "image_processing/core/float_to_integer.h"

namespace pelorin::image_processing {

/// Linear light, 0 ... 1, of each 8-bit sRGB code (IEC 61966-2-1): the formula in double, rounded
/// once. Checked by SRGBToLinearTable.IsTheFormulaRoundedOnce. There before any code runs.
extern const std::array<float, 256> sRGBToLinearTable;

/// Steps in which sRGB is encoded.
inline constexpr int sRGBSteps = 1024;

/// Encodes linear light as 8-bit sRGB through 1024 steps. Entries are truncated, not rounded, so
/// only the last is 255. Read-only, so any thread may look up.
class Uint8_Gamma_sRGB_Table {
 public:
  Uint8_Gamma_sRGB_Table();

  /// The code of linear light `value`: below 0 (and NaN) code 0, above 1 code 255.
  std::uint8_t operator()(float value) const {
    const std::int32_t index = truncateTo<std::int32_t>(value * static_cast<float>(maxIndex));
    if (index < 0) return 0;
    if (index > static_cast<std::int32_t>(maxIndex)) return 255;
    return codes_[index];
  }

  /// The codes by step, 0 ... 255.
  std::array<float, sRGBSteps> asFloats() const {
    std::array<float, sRGBSteps> codes;
    std::copy(codes_.begin(), codes_.end(), codes.begin());
    return codes;
  }

 private:
  static constexpr std::uint32_t maxIndex = sRGBSteps - 1;
  std::array<std::uint8_t, maxIndex + 1> codes_;
};

}  // namespace pelorin::image_processing
