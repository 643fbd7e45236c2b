#pragma once

#include <cstdint>

#include "image_processing/autoenhance/colour/colour_tables.h"
#include "image_processing/autoenhance/colour/lab_constants.h"
#include "image_processing/core/pixel_types.h"

namespace pelorin::image_processing {

/// A colour in CIE Lab under D65: L in [0, 100], a and b near [-100, 100].
struct Lab {
  float L, a, b;
};

/// 8-bit sRGB to Lab.
inline Lab rgbToLab(const ColourTables& tables, std::uint8_t r, std::uint8_t g, std::uint8_t b) {
  const float R = sRGBToLinearTable[r], G = sRGBToLinearTable[g], B = sRGBToLinearTable[b];
  const float fx = tables.xyzToLab(xOfRgb(R, G, B));
  const float fy = tables.xyzToLab(yOfRgb(R, G, B));
  const float fz = tables.xyzToLab(zOfRgb(R, G, B));
  return {labLGain * fy - labLOffset, labAGain * (fx - fy), labBGain * (fy - fz)};
}

/// Lab to 8-bit sRGB; what lies outside the gamut is clipped channel by channel.
inline void labToRgb(const ColourTables& tables, const Lab& lab, std::uint8_t& r, std::uint8_t& g,
                     std::uint8_t& b) {
  const float fy = (lab.L + labLOffset) / labLGain;
  const float X = tables.labToXz(lab.a / labAGain + fy);
  const float Y = tables.labToY(lab.L);
  const float Z = tables.labToXz(fy - lab.b / labBGain);
  r = tables.encode(redOfXyz(X, Y, Z));
  g = tables.encode(greenOfXyz(X, Y, Z));
  b = tables.encode(blueOfXyz(X, Y, Z));
}

/// As above, with the process's tables; for single colours.
inline Lab rgbToLab(std::uint8_t r, std::uint8_t g, std::uint8_t b) {
  return rgbToLab(colourTables(), r, g, b);
}
inline void labToRgb(const Lab& lab, std::uint8_t& r, std::uint8_t& g, std::uint8_t& b) {
  labToRgb(colourTables(), lab, r, g, b);
}

}  // namespace pelorin::image_processing
