#include "photo/turned_image.h"

#include <algorithm>
#include <cstddef>

namespace pelorin::photo {

using image_processing::Image;
using image_processing::RGBA8Pixel;

void turnRows(const RGBA8Pixel* rows, std::uint32_t first, std::uint32_t count, PictureSize size,
              Turn turn, const Image<RGBA8Pixel>& result) {
  const std::ptrdiff_t width = size.width, bottomRow = std::ptrdiff_t{first} + count;

  // Where the source's first pixel goes, and how far apart its neighbours to the right and below
  // come to stand.
  const std::ptrdiff_t rowLength = result.width;
  const std::ptrdiff_t lastX = rowLength - 1, lastRow = (result.height - 1) * rowLength;
  std::ptrdiff_t origin = 0, right = 1, down = rowLength;
  if (turn.quarters == 1) origin = lastX, right = rowLength, down = -1;
  if (turn.quarters == 2) origin = lastRow + lastX, right = -1, down = -rowLength;
  if (turn.quarters == 3) origin = lastRow, right = -rowLength, down = 1;
  if (turn.mirrored) {
    origin += (width - 1) * right;
    right = -right;
  }

  // In tiles, because one of the two pictures is walked along its columns.
  constexpr std::ptrdiff_t tile = 32;
  RGBA8Pixel* const target = result.data.get();
  for (std::ptrdiff_t top = first; top < bottomRow; top += tile) {
    for (std::ptrdiff_t left = 0; left < width; left += tile) {
      const std::ptrdiff_t bottom = std::min(top + tile, bottomRow);
      const std::ptrdiff_t end = std::min(left + tile, width);
      for (std::ptrdiff_t y = top; y < bottom; ++y) {
        for (std::ptrdiff_t x = left; x < end; ++x) {
          target[origin + x * right + y * down] = rows[(y - first) * width + x];
        }
      }
    }
  }
}

std::shared_ptr<Image<RGBA8Pixel>> readTurned(RowReader& reader, Turn turn, SparePixels& spare) {
  const PictureSize size = reader.size(), upright = turnedSize(size, turn);
  const std::shared_ptr<Image<RGBA8Pixel>> picture = spare.picture(upright.width, upright.height);
  if (turn == Turn{}) {
    reader.read(picture->data.get(), size.height);
    return picture;
  }
  constexpr std::uint32_t rowsRead = 64;  // what a processor has room for beside its work
  const Image<RGBA8Pixel> room(size.width, std::min(size.height, rowsRead));
  for (std::uint32_t y = 0; y < size.height;) {
    const std::uint32_t count = std::min(size.height - y, room.height);
    reader.read(room.data.get(), count);
    turnRows(room.data.get(), y, count, size, turn, *picture);
    y += count;
  }
  return picture;
}

}  // namespace pelorin::photo
