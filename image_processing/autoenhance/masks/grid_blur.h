#pragma once

#include "image_processing/autoenhance/masks/grid.h"

namespace pelorin::image_processing {

/// Blurs values and weights alike along columns, rows and lightness, in that order: with a fixed
/// bell of five taps in space, mirrored at the borders, and one of radius 32 · `sigmaRange` bins,
/// truncated, in lightness, where nothing lies beyond the ends. A radius of 0 or less leaves 0 in
/// every node. Nodes hold finite numbers from 0 on. @throws std::bad_alloc for one line of cells.
void blur(Grid& grid, float sigmaRange);

/// The definition of `blur`.
void blurScalar(Grid& grid, float sigmaRange);

}  // namespace pelorin::image_processing
