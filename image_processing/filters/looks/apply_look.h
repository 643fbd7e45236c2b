#pragma once

#include "image_processing/core/image.h"
#include "image_processing/core/workers.h"
#include "image_processing/filters/looks/look.h"

namespace pelorin::image_processing {

/// Applies a look: the vignette, the channel mix, then one tone curve a channel; alpha is copied.
/// Walks both images in storage order and stops at the end of the shorter; coordinates are those of
/// `source`.
/// @param output   written; its own pixels, or exactly those of `source`.
/// @param workers  share the work; null for none.
/// @throws std::bad_alloc when its tables (at most 300 KB, and one float a column and a row) do
///         not fit; `output` is then as it was.
///
/// Keeps no state, so any thread may call it for outputs of its own.
void applyLook(const Look& look, const Image<RGBA8Pixel>& source, Image<RGBA8Pixel>& output,
               Workers* workers = nullptr);

/// The definition of `applyLook`, one pixel at a time. Allocates nothing and never throws.
void applyLookScalar(const Look& look, const Image<RGBA8Pixel>& source, Image<RGBA8Pixel>& output);

}  // namespace pelorin::image_processing
