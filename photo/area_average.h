#pragma once

#include "image_processing/core/image.h"
#include "photo/picture_size.h"

namespace pelorin::photo {

/// The largest size of the picture's shape that fits the box; a picture smaller than the box keeps
/// its own. Both sides of the result are at least 1, however thin the picture.
PictureSize fitWithin(PictureSize picture, PictureSize box);

/// The picture at another size: each new pixel is the average of the area of old pixels that it
/// covers, fractions included, rounded to nearest; alpha is 255. Averages bytes as they are (gamma
/// encoded), exactly, so that a flat picture stays as it is.
/// @param picture  at least one pixel.
/// @param size     both sides at least 1; meant to be smaller than the picture.
/// @throws std::bad_alloc when the result does not fit into memory.
image_processing::Image<image_processing::RGBA8Pixel> areaAverage(
    const image_processing::Image<image_processing::RGBA8Pixel>& picture, PictureSize size);

}  // namespace pelorin::photo
