#pragma once

#include <cstdint>

#include "image_processing/core/image.h"

namespace pelorin::test_support {

/// True when the floats have the same bytes, NaN included.
bool sameBytes(const float* a, const float* b, std::size_t count);

/// A grey image with the fractions that pictures have, and some flat parts.
image_processing::Image<float> greyImage(std::uint32_t width, std::uint32_t height,
                                         std::uint64_t seed);

/// Values as a structure image has them, from -2 to 2, a few of them 0.
image_processing::Image<float> coefficients(std::uint32_t width, std::uint32_t height,
                                            std::uint64_t seed);

}  // namespace pelorin::test_support
