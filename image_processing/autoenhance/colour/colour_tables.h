#pragma once

#include <array>

#include "image_processing/autoenhance/colour/lab_tables.h"
#include "image_processing/autoenhance/colour/srgb.h"
#include "image_processing/autoenhance/masks/shaping_tables.h"

namespace pelorin::image_processing {

/// Every table that auto-enhance shares between photos. Built together, in one place, because
/// tables of several files would be built in an order that the linker chooses.
struct ColourTables {
  XYZ2labTable xyzToLab{compandingSamples};
  Lab2xzTable labToXz{inverseCompandingSamples};
  Lab2yTable labToY{inverseCompandingSamples};
  Uint8_Gamma_sRGB_Table encode;
  SuperQuadric skinA{-10.0f, 50.0f, 1024, 10.0f};          ///< How much a Lab a is a skin's.
  SuperQuadric skinB{-10.0f, 60.0f, 1024, 10.0f};          ///< How much a Lab b is a skin's.
  std::array<float, sRGBSteps> codes = encode.asFloats();  ///< `encode`, as vectors gather it.
  Power flatness{0.0f, 1.0f, 512, 1.5f};                   ///< Shapes the share of flat neighbours.
};

/// The process's tables, built when the library is loaded, never written afterwards and never
/// destroyed, so any thread may read them until the process is gone. A loop over pixels asks once,
/// before it starts.
const ColourTables& colourTables();

}  // namespace pelorin::image_processing
