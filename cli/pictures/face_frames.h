#pragma once

#include "image_processing/core/image.h"
#include "image_processing/core/image_metadata.h"
#include "photo/picture_size.h"

namespace pelorin::cli {

/// Draws a frame around each face into a small picture of a photo, white within black so that it shows
/// on any colour; what lies outside the picture is cut off.
/// @param faces  in pixels of the photo.
/// @param photo  its size.
void frameFaces(image_processing::Image<image_processing::RGBA8Pixel>& small,
                const image_processing::ImageMetadata& faces, photo::PictureSize photo);

}  // namespace pelorin::cli
