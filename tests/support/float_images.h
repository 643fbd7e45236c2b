#pragma once

#include <cstdint>

#include "image_processing/core/image.h"

namespace pelorin::test_support {

/// Every value the same.
image_processing::Image<float> constantImage(std::uint32_t width, std::uint32_t height,
                                             float value);

/// Noise in [0, 1).
image_processing::Image<float> randomImage(std::uint32_t width, std::uint32_t height,
                                           std::uint64_t seed);

}  // namespace pelorin::test_support
