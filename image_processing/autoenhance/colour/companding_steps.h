#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "image_processing/autoenhance/colour/lab_constants.h"
#include "image_processing/core/pixel_types.h"

namespace pelorin::image_processing {

/// Number of steps in which Lab's companding is tabulated. A pixel's lightness depends on its step
/// alone, and so does all that follows from lightness.
inline constexpr std::size_t compandingStepCount = compandingSamples;

/// The step, 0 ... 9999, of the luminance of each of `count` pixels: the index that the XYZ-to-Lab
/// table is read at for L.
/// @param steps  `count` of them, written.
/// Never throws and keeps no state.
void compandingSteps(const RGBA8Pixel* pixels, std::uint16_t* steps, std::size_t count);

/// The definition of `compandingSteps`.
void compandingStepsScalar(const RGBA8Pixel* pixels, std::uint16_t* steps, std::size_t count);

/// L / 100 of each of `count` steps. Never throws and keeps no state.
void unitLightness(const std::uint16_t* steps, float* lightness, std::size_t count);

/// L of each step.
const std::array<float, compandingStepCount>& lightnessOfSteps();

/// L / 100 of each step.
const std::array<float, compandingStepCount>& unitLightnessOfSteps();

}  // namespace pelorin::image_processing
