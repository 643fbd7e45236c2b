#include "image_processing/autoenhance/colour/companding_steps.h"

#include "image_processing/autoenhance/colour/colour_tables.h"

namespace pelorin::image_processing {
namespace {

/// L of every step, divided.
std::array<float, compandingStepCount> makeLightness(float divisor) {
  const std::vector<float>& fy = colourTables().xyzToLab.samples();
  std::array<float, compandingStepCount> lightness;
  for (std::size_t step = 0; step < compandingStepCount; ++step) {
    lightness[step] = (labLGain * fy[step] - labLOffset) / divisor;
  }
  return lightness;
}

}  // namespace

void compandingStepsScalar(const RGBA8Pixel* pixels, std::uint16_t* steps, std::size_t count) {
  const ColourTables& tables = colourTables();
  for (std::size_t i = 0; i < count; ++i) {
    const float R = sRGBToLinearTable[pixels[i].r];
    const float G = sRGBToLinearTable[pixels[i].g];
    const float B = sRGBToLinearTable[pixels[i].b];
    steps[i] = static_cast<std::uint16_t>(tables.xyzToLab.indexOf(yOfRgb(R, G, B)));
  }
}

const std::array<float, compandingStepCount>& lightnessOfSteps() {
  static const auto lightness = makeLightness(1.0f);
  return lightness;
}

const std::array<float, compandingStepCount>& unitLightnessOfSteps() {
  static const auto lightness = makeLightness(labWhite);
  return lightness;
}

}  // namespace pelorin::image_processing
