#pragma once

#include <cstdint>
#include <memory>
#include <span>

#include "image_processing/core/image.h"
#include "photo/picture_size.h"

namespace pelorin::photo {

/// A picture of packed RGBA bytes, rows back to back.
/// @throws PhotoError when there are more or fewer bytes than the size needs, and std::bad_alloc.
std::shared_ptr<image_processing::Image<image_processing::RGBA8Pixel>> readRawPixels(
    std::span<const std::uint8_t> bytes, PictureSize size);

}  // namespace pelorin::photo
