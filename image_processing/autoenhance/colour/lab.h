#pragma once

#include <cstdint>

#include "image_processing/autoenhance/colour/colour_tables.h"
#include "image_processing/core/pixel_types.h"

namespace pelorin::image_processing {

/// A colour in CIE Lab under D65: L in [0, 100], a and b near [-100, 100].
struct Lab {
  float L, a, b;
};

/// 8-bit sRGB to Lab. The matrix is sRGB to XYZ with the white point divided out.
inline Lab rgbToLab(const ColourTables& tables, std::uint8_t r, std::uint8_t g, std::uint8_t b) {
  const float R = sRGBToLinearTable[r], G = sRGBToLinearTable[g], B = sRGBToLinearTable[b];
  const float fx = tables.xyzToLab(0.43394995f * R + 0.3762098f * G + 0.1898403f * B);
  const float fy = tables.xyzToLab(0.2126729f * R + 0.7151522f * G + 0.072175f * B);
  const float fz = tables.xyzToLab(0.017756583f * R + 0.10946796f * G + 0.87277544f * B);
  return {116.0f * fy - 16.0f, 500.0f * (fx - fy), 200.0f * (fy - fz)};
}

/// Lab to 8-bit sRGB; what lies outside the gamut is clipped channel by channel.
inline void labToRgb(const ColourTables& tables, const Lab& lab, std::uint8_t& r, std::uint8_t& g,
                     std::uint8_t& b) {
  const float fy = (lab.L + 16.0f) / 116.0f;
  const float X = tables.labToXz(lab.a / 500.0f + fy);
  const float Y = tables.labToY(lab.L);
  const float Z = tables.labToXz(fy - lab.b / 200.0f);
  r = tables.encode(3.0799544f * X - 1.5371385f * Y - 0.5428159f * Z);
  g = tables.encode(-0.9212582f * X + 1.8760108f * Y + 0.04524742f * Z);
  b = tables.encode(0.05288738f * X - 0.2040259f * Y + 1.1511385f * Z);
}

/// As above, with the process's tables; for single colours.
inline Lab rgbToLab(std::uint8_t r, std::uint8_t g, std::uint8_t b) {
  return rgbToLab(colourTables(), r, g, b);
}
inline void labToRgb(const Lab& lab, std::uint8_t& r, std::uint8_t& g, std::uint8_t& b) {
  labToRgb(colourTables(), lab, r, g, b);
}

}  // namespace pelorin::image_processing
