#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "image_processing/core/image.h"
#include "image_processing/filters/row_bands.h"

namespace pelorin::image_processing {

/// Filters rows that depend on themselves and their place alone.
/// @param map  called with the number of the first of some rows, the rows, room for as many and
///             how many pixels that is; returns where the filtered rows stand, either there or in
///             the room for all rows alike. Workers call it at the same time.
/// @returns false when it gave up.
template <typename Map>
bool mapRows(std::uint32_t width, std::uint32_t height, RowSource& rows, RowSink& filtered,
             const RowWork& work, Map map) {
  RowBands bands(width, height, work, 3);
  std::vector<Image<RGBA8Pixel>> rooms;
  for (std::int64_t i = bandsUnderWay(2, work.workers); i > 0; --i)
    rooms.emplace_back(width, std::min(work.bandHeight, height));
  std::vector<const RGBA8Pixel*> made(rooms.size());
  const auto place = [&](std::int64_t band) {
    return static_cast<std::size_t>(band) % rooms.size();
  };

  const std::size_t parts = tasksFor(work.workers);
  const Stage read = {1, [&](std::int64_t band, std::size_t) { bands.read(band, rows); }};
  const Stage mapThem = {
      parts, [&](std::int64_t band, std::size_t part) {
        const std::uint64_t count = bands.rows(band);
        const auto first = static_cast<std::uint32_t>(partStart(count, part, parts));
        const auto end = static_cast<std::uint32_t>(partStart(count, part + 1, parts));
        const std::size_t before = std::size_t{width} * first;
        const RGBA8Pixel* const to =
            map(bands.first(band) + first, bands.pixels(band) + before,
                rooms[place(band)].data.get() + before, std::size_t{width} * (end - first));
        if (part == 0) made[place(band)] = to;
      }};
  const Stage write = {1, [&](std::int64_t band, std::size_t) {
                         filtered.write(made[place(band)], bands.rows(band));
                       }};
  return runStages(bands.count(), {read, mapThem, write}, work.workers, work.stop);
}

}  // namespace pelorin::image_processing
