#include "photo/turned_image.h"

#include <algorithm>
#include <cstddef>
#include <vector>

#include "image_processing/core/stages.h"

namespace pelorin::photo {

using image_processing::bandsUnderWay;
using image_processing::Image;
using image_processing::RGBA8Pixel;
using image_processing::runStages;
using image_processing::Stage;
using image_processing::Workers;

void turnRows(const RGBA8Pixel* rows, std::uint32_t first, std::uint32_t count, PictureSize size,
              Turn turn, const Image<RGBA8Pixel>& result) {
  const std::ptrdiff_t width = size.width, bottomRow = static_cast<std::ptrdiff_t>(first) + count;

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

void readTurned(RowReader& reader, Turn turn, const Image<RGBA8Pixel>& picture, Workers* workers) {
  const PictureSize size = reader.size();
  if (turn == Turn{}) return reader.read(picture.data.get(), size.height);
  constexpr std::uint32_t rowsRead = 64;  // what a processor has room for beside its work
  std::vector<Image<RGBA8Pixel>> rooms;
  for (std::int64_t i = bandsUnderWay(2, workers); i > 0; --i)
    rooms.emplace_back(size.width, std::min(size.height, rowsRead));
  const auto roomOf = [&](std::int64_t band) {
    return rooms[static_cast<std::size_t>(band) % rooms.size()].data.get();
  };
  const auto firstOf = [](std::int64_t band) {
    return static_cast<std::uint32_t>(band) * rowsRead;
  };
  const auto rowsOf = [&](std::int64_t band) {
    return std::min(size.height - firstOf(band), rowsRead);
  };
  const Stage read = {
      1, [&](std::int64_t band, std::size_t) { reader.read(roomOf(band), rowsOf(band)); }};
  const Stage turnThem = {1, [&](std::int64_t band, std::size_t) {
                            turnRows(roomOf(band), firstOf(band), rowsOf(band), size, turn,
                                     picture);
                          }};
  runStages((std::int64_t{size.height} + rowsRead - 1) / rowsRead, {read, turnThem}, workers);
}

}  // namespace pelorin::photo
