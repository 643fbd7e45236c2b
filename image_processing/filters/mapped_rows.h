#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>

#include "image_processing/core/image.h"
#include "image_processing/filters/row_filter.h"

namespace pelorin::image_processing {

/// Filters rows that depend on themselves and their place alone.
/// @param map  called with the number of the first of some rows, the rows, room for as many and
///             how many pixels that is; returns where the filtered rows stand.
/// @returns false when it gave up.
template <typename Map>
bool mapRows(std::uint32_t width, std::uint32_t height, RowSource& rows, RowSink& filtered,
             const RowWork& work, Map map) {
  const std::uint32_t band = std::min(work.bandHeight, height);
  const Image<RGBA8Pixel> room(width, band), made(width, band);
  for (std::uint32_t y = 0; y < height; y += band) {
    if (shallStop(work)) return false;
    const std::uint32_t count = std::min(band, height - y);
    const RGBA8Pixel* const from = rows.next(count, room.data.get());
    filtered.write(map(y, from, made.data.get(), std::size_t{width} * count), count);
  }
  return true;
}

}  // namespace pelorin::image_processing
