#pragma once

#include <cstdint>

#include "image_processing/core/export.h"
#include "image_processing/core/image.h"

namespace pelorin::image_processing {

/// What each of 2 x 2 pixels counts in their mean.
constexpr float imHalveShare = 0.25f;

/// Halves a grey image in place: each pixel becomes the mean of 2 x 2, summed along the upper row,
/// then along the lower one, times `imHalveShare`. An odd last row or column is dropped.
/// @param image   its top left `width` x `height` pixels are halved. Its own size, and with it the
///                distance between rows, stays; pixels outside the half are unspecified afterwards.
/// @param width   at most the image's width; halved, rounding down.
/// @param height  at most the image's height; halved, rounding down.
/// Values of pictures, 0 ... 255, are meant; results that are denormal may be 0 on 32-bit ARM.
/// Never throws; distinct images may be halved at once.
PELORIN_EXPORT void imHalve(Image<float>& image, std::uint32_t& width, std::uint32_t& height);

/// The definition of `imHalve`.
void imHalveScalar(Image<float>& image, std::uint32_t& width, std::uint32_t& height);

}  // namespace pelorin::image_processing
