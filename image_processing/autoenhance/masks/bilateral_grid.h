#pragma once

#include "image_processing/autoenhance/masks/grid.h"
#include "image_processing/core/image.h"

namespace pelorin::image_processing {

/// Smooths a lightness image and keeps its edges, through a coarse grid over y, x and lightness
/// that is blurred and read back by trilinear interpolation.
/// @param lightness   values in [0, 1] (Lab lightness / 100). Others, infinities and NaN included,
///                    make no error and give what the definition gives.
/// @param sigmaRange  lightness difference that counts as an edge, in (0, 1]; below 1/32 the range
///                    kernel is empty and the output is all 0.
/// @param spatial     cell size in pixels, truncated; meant from 1 to the shorter side. Outside of
///                    that, the cell is one pixel or the grid one node along the side.
/// @param smoothed    written; of the size of `lightness`, its own buffer. Images are shared, so
///                    writing into the copy fills the caller's.
/// @throws std::bad_alloc when the grid of columns x rows x 32 nodes does not fit,
///         std::invalid_argument when `smoothed` has another width or fewer rows.
///
/// Keeps no state; calls with different outputs may run at once. After Chen, Paris and Durand,
/// "Real-time Edge-Aware Image Processing with the Bilateral Grid" (2007), with a piecewise cubic
/// in place of the Gaussian. For T = float and QuantizedFloat<unsigned char>.
template <typename T>
void bilateralFilterGridApproximation(Image<float> lightness, float sigmaRange, float spatial,
                                      Image<T> smoothed);

/// The definition of `bilateralFilterGridApproximation`.
template <typename T>
void bilateralFilterGridApproximationScalar(const Image<float>& lightness, float sigmaRange,
                                            float spatial, Image<T>& smoothed);

/// Side in pixels, a whole number, of the grid's cells for a smoothing extent.
float gridCellSize(float spatial);

/// An empty grid over a picture of at least one pixel. @throws std::bad_alloc.
Grid makeGrid(std::uint32_t width, std::uint32_t height, float cellSize);

}  // namespace pelorin::image_processing
