#pragma once

#include <array>
#include <cstdint>

#include "image_processing/core/export.h"
#include "image_processing/core/image.h"

namespace pelorin::image_processing {

/// Weights at offsets -3 ... 3 for the local mean and deviation: a Gaussian of sigma 7/6, sum 1
/// (Mittal, Soundararajan and Bovik, "Making a Completely Blind Image Quality Analyzer", 2013).
/// Checked by NiqeWindow.IsTheGaussianRoundedOnce.
constexpr std::array<float, 7> niqeWindow = {0.012560201f, 0.07882796f, 0.23729607f, 0.34263152f,
                                             0.23729607f,  0.07882796f, 0.012560201f};

/// What is left of a grey picture when its local brightness and contrast are taken out: each pixel
/// minus the mean around it, divided by the deviation around it plus 1. Mean and mean square go
/// through the window along columns, then along rows, each sum from 0 in the order of the offsets;
/// beyond a border the border's pixel counts.
/// @param grey       its top left `width` x `height` pixels, meant to be 0 ... 255; numbers in
///                   between that are denormal may count as 0 on 32-bit ARM.
/// @param structure  its top left `width` x `height` pixels are written; not `grey`. The images may
///                   differ in size, both at least `width` x `height`.
/// @throws std::bad_alloc for the rows it needs in between; std::invalid_argument when an image is
///         smaller.
/// Keeps no state; distinct structures may be computed at once.
PELORIN_EXPORT void computeImageStructure_fast(const Image<float>& grey, std::uint32_t width,
                                               std::uint32_t height, Image<float>& structure);

/// The definition of `computeImageStructure_fast`; needs two more images of `width` x `height`.
PELORIN_EXPORT void computeImageStructure(const Image<float>& grey, std::uint32_t width,
                                          std::uint32_t height, Image<float>& structure);

}  // namespace pelorin::image_processing
