#pragma once

#include <cstdint>
#include <vector>

#include "photo/photo.h"
#include "photo/picture_size.h"

namespace pelorin::cli {

/// At which scale a photo is decoded that is to be shown small: the smallest one that leaves its longer
/// side at `longestSide` pixels or more; 1 where it has fewer.
int scaleForSide(photo::PictureSize photo, std::uint32_t longestSide);

/// A picture as a JPEG file, with the colour profile of the photo that it is of and nothing else. What
/// is transparent shows white.
/// @throws as `photo::save`.
std::vector<std::uint8_t> smallJpeg(
    const image_processing::Image<image_processing::RGBA8Pixel>& picture,
    const photo::Metadata& metadata, int quality);

}  // namespace pelorin::cli
