#pragma once

#include "image_processing/core/image.h"
#include "image_processing/core/image_metadata.h"

namespace pelorin::image_processing {

// A pair: `blendFaceIntoMask` defines what a face does; `FaceBlendRows` does it for all of a photo.

/// Draws the LTM mask toward 0.5 on the skin-coloured pixels in and around one face: the box grown
/// to twice its size about its centre and cut to the photo, fading out toward its border. A region
/// without width or height after the cut is skipped.
/// @param photo  of the size of `mask`.
/// May throw std::bad_alloc. For float and QuantizedFloat<unsigned char>.
template <typename TL>
void blendFaceIntoMask(const BoundingBox& face, const Image<RGBA8Pixel>& photo, Image<TL>& mask);

}  // namespace pelorin::image_processing
