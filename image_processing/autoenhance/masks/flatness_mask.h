#pragma once

#include "image_processing/core/image.h"

namespace pelorin::image_processing {

/// How flat the neighbourhood of each pixel is: the share of a square window, mirrored at the
/// borders, that carries almost no detail, to the power 1.5. Detail is the difference between
/// lightness and its smoothing, and stops counting as none at 20/255.
/// @param lightness  values in [0, 1].
/// @param smoothed   the smoothing of `lightness`, of the same size.
/// @param radius     half-size of the window, at least 0; below 0 there is no window and the mask
///                   is 0. The window is centred one pixel right of and below the mask pixel.
/// @param mask       written; of the size of `lightness`. Its own buffer.
/// @throws std::bad_alloc when about 2 · radius rows of sums do not fit.
///
/// Keeps no state. For (float, float) and (QuantizedFloat<unsigned char>, the same).
template <typename TB, typename TL>
void computeFlatnessMask(const Image<float>& lightness, const Image<TB>& smoothed, int radius,
                         Image<TL>& mask);

/// The definition of `computeFlatnessMask`.
template <typename TB, typename TL>
void computeFlatnessMaskScalar(const Image<float>& lightness, const Image<TB>& smoothed, int radius,
                               Image<TL>& mask);

}  // namespace pelorin::image_processing
