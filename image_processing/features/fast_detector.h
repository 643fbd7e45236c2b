#pragma once

#include <cstddef>
#include <cstdint>

#include "image_processing/features/malloc_array.h"
#include "image_processing/features/xy.h"

namespace pelorin::image_processing {

/// A grey picture in the caller's memory: the pixel of column x and row y is
/// `pixels[y * stride + x]`, with a stride of either sign. Without pixels it counts as empty.
struct GreyPixels {
  const std::uint8_t* pixels;
  int width;
  int height;
  std::ptrdiff_t stride;
};

/// The corners of a picture in raster order, each with `arc` neighbouring circle pixels, 9 to 12,
/// that differ by more than `threshold`, any number.
/// @returns memory even when there are none.
/// @throws std::bad_alloc
MallocArray<xy> detectCorners(const GreyPixels& image, int arc, int threshold);

/// The score of each corner, as `cornerScore` defines it.
/// @returns memory even when there are none.
/// @throws std::bad_alloc
MallocArray<int> scoreCorners(const GreyPixels& image, const xy* corners, std::size_t count,
                              int arc, int threshold);

/// The corners that score higher than each of their eight neighbours, in the order of `corners`.
/// @param corners  in raster order, any positions.
/// @returns room for all `count` corners; no memory when `count` is 0 or they are in another order.
/// @throws std::bad_alloc
MallocArray<xy> keepMaxima(const xy* corners, const int* scores, std::size_t count);

/// `detectCorners`, `scoreCorners` and `keepMaxima` in one pass over the picture.
/// @returns no memory when there are no corners.
/// @throws std::bad_alloc
MallocArray<xy> detectMaxima(const GreyPixels& image, int arc, int threshold);

}  // namespace pelorin::image_processing
