#pragma once

#include <string>

#include "image_processing/core/image.h"
#include "image_processing/core/image_metadata.h"
#include "image_processing/core/pixel_types.h"
#include "tests/support/bytes.h"

namespace pelorin::test_support {

/// The packed RGBA bytes that the engine itself makes of a picture, in a session of its own.
Bytes filteredDirectly(const image_processing::Image<image_processing::RGBA8Pixel>& source,
                       const std::string& filter, const std::string& params,
                       const image_processing::ImageMetadata& faces = {});

}  // namespace pelorin::test_support
