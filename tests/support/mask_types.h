#pragma once

#include <gtest/gtest.h>

#include "image_processing/core/pixel_types.h"

namespace pelorin::test_support {

/// A mask value in one byte.
using Quantized = image_processing::QuantizedFloat<unsigned char>;

/// What the pixels of a mask may be.
using MaskTypes = testing::Types<float, Quantized>;

}  // namespace pelorin::test_support
