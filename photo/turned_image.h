#pragma once

#include <cstdint>

#include "image_processing/core/image.h"
#include "image_processing/core/workers.h"
#include "photo/picture_size.h"
#include "photo/rows.h"
#include "photo/turn.h"

namespace pelorin::photo {

/// The size of a picture once it is turned.
inline PictureSize turnedSize(PictureSize size, Turn turn) {
  return turn.swapsAxes() ? PictureSize{size.height, size.width} : size;
}

/// Turns some rows of a picture into their place in the turned one, so that the two need not exist
/// at once. Never throws.
/// @param rows    `count` of them from row `first` on, back to back.
/// @param size    of the picture before it is turned.
/// @param result  of `turnedSize`; only the pixels that the rows become are written.
void turnRows(const image_processing::RGBA8Pixel* rows, std::uint32_t first, std::uint32_t count,
              PictureSize size, Turn turn,
              const image_processing::Image<image_processing::RGBA8Pixel>& result);

/// Reads all rows of a reader and turns them while they come, so that there is one picture and not
/// two.
/// @param picture  of `turnedSize`; all of it is written.
/// @param workers  let the turning and the reading go on at the same time; null for none.
/// @throws what the reader throws; std::bad_alloc.
void readTurned(RowReader& reader, Turn turn,
                const image_processing::Image<image_processing::RGBA8Pixel>& picture,
                image_processing::Workers* workers = nullptr);

}  // namespace pelorin::photo
