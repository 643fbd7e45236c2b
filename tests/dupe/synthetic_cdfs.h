#pragma once

#include <cstdint>

#include "image_processing/dupe/green_cdf.h"

namespace pelorin::test_support {

/// A distribution as photos have them, made without pixels: a few humps of light on a floor of
/// noise. The same seed gives the same distribution on every platform.
image_processing::GreenCDF syntheticCDF(std::uint64_t seed);

/// What the same scene gives a moment later: `scene` with a little of the light moved, by up to
/// `share` of the pixels a bin.
/// @param pixelCount  receives of how many pixels the distribution is, as many as of a photo of 12
///                    megapixels are counted.
image_processing::GreenCDF anotherShot(const image_processing::GreenCDF& scene, float share,
                                       std::uint64_t seed, std::uint64_t* pixelCount = nullptr);

}  // namespace pelorin::test_support
