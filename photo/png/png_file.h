#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "image_processing/core/image.h"
#include "photo/photo_error.h"

namespace pelorin::photo {

/// The bytes of a PNG file with exactly these pixels, alpha included and not multiplied in.
/// @throws PhotoError when a side is 0 or the pixels are more than 2 GB, and std::bad_alloc.
std::vector<std::uint8_t> encodePng(
    const image_processing::Image<image_processing::RGBA8Pixel>& picture);

/// The same for a grey picture, one byte a pixel.
std::vector<std::uint8_t> encodePng(const image_processing::Image<unsigned char>& grey);

/// The pixels of a PNG file of any kind, as 8-bit RGBA.
/// @throws PhotoError when the bytes are no PNG file or are damaged or more than 2 GB of pixels, and
///         std::bad_alloc.
image_processing::Image<image_processing::RGBA8Pixel> decodePng(std::span<const std::uint8_t> file);

}  // namespace pelorin::photo
