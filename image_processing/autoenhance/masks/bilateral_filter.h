#pragma once

#include "image_processing/core/image.h"
#include "image_processing/core/workers.h"

namespace pelorin::image_processing {

/// Smooths a lightness image and keeps its edges, exactly: every pixel becomes a weighted mean over
/// a square window, mirrored at the borders. The spatial weight depends on the horizontal offset
/// alone, on purpose: rows above and below count as much as the pixel's own.
/// @param lightness   values in [0, 1].
/// @param sigmaRange  lightness difference at which a neighbour stops counting.
/// @param radius      half the window's side in pixels; 0 or less returns every pixel unchanged.
/// @param smoothed    written; of the size of `lightness`, its own buffer.
/// @param workers     share the rows; null for none.
/// @throws std::bad_alloc; what the workers throw.
///
/// Keeps no state. Costs (2 · radius + 1)² weights a pixel: the slow alternative to the grid. For
/// T = float and QuantizedFloat<unsigned char>.
template <typename T>
void bilateralFilter(const Image<float>& lightness, float sigmaRange, int radius,
                     Image<T>& smoothed, Workers* workers = nullptr);

}  // namespace pelorin::image_processing
