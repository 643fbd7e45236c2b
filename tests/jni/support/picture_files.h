#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "image_processing/core/image.h"
#include "tests/support/temporary_folder.h"

namespace pelorin::test_support {

/// Writes `picture` with the codec the tests use.
void writePicture(const std::string& path,
                  const image_processing::Image<image_processing::RGBA8Pixel>& picture);

std::vector<std::uint8_t> contentOf(const std::string& path);

}  // namespace pelorin::test_support
