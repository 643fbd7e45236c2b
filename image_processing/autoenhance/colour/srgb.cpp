#include "image_processing/autoenhance/colour/srgb.h"

#include <cmath>

namespace pelorin::image_processing {

std::array<float, 256> makeSRGBToLinearTable() {
  std::array<float, 256> table;
  for (int code = 0; code < 256; ++code) {
    const double c = code / 255.0;
    table[code] = static_cast<float>(c <= 0.04045 ? c / 12.92 : std::pow((c + 0.055) / 1.055, 2.4));
  }
  return table;
}

Uint8_Gamma_sRGB_Table::Uint8_Gamma_sRGB_Table() {
  for (std::uint32_t i = 0; i <= maxIndex; ++i) {
    const float v = static_cast<float>(i) / static_cast<float>(maxIndex);
    const float encoded =
        v <= 0.0031308f ? 12.92f * v
                        : static_cast<float>(
                              1.055 * std::pow(static_cast<double>(v), 0.4166666666666667) - 0.055);
    codes_[i] = truncateTo<std::uint8_t>(encoded * 255.0f);
  }
}

}  // namespace pelorin::image_processing
