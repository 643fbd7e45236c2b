#include "photo/turned_image.h"

#include <algorithm>
#include <cstddef>

namespace pelorin::photo {

using image_processing::Image;
using image_processing::makeSharedImage;
using image_processing::RGBA8Pixel;

std::shared_ptr<Image<RGBA8Pixel>> turned(const std::shared_ptr<Image<RGBA8Pixel>>& picture,
                                          Turn turn) {
  if (turn == Turn{}) return picture;
  const std::ptrdiff_t width = picture->width, height = picture->height;
  const bool sideways = turn.quarters % 2 == 1;
  auto result = sideways ? makeSharedImage<RGBA8Pixel>(picture->height, picture->width)
                         : makeSharedImage<RGBA8Pixel>(picture->width, picture->height);

  // Where the source's first pixel goes, and how far apart its neighbours to the right and below
  // come to stand.
  const std::ptrdiff_t rowLength = result->width;
  const std::ptrdiff_t lastX = rowLength - 1, lastRow = (result->height - 1) * rowLength;
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
  const RGBA8Pixel* source = picture->data.get();
  RGBA8Pixel* target = result->data.get();
  for (std::ptrdiff_t top = 0; top < height; top += tile) {
    for (std::ptrdiff_t left = 0; left < width; left += tile) {
      const std::ptrdiff_t bottom = std::min(top + tile, height);
      const std::ptrdiff_t end = std::min(left + tile, width);
      for (std::ptrdiff_t y = top; y < bottom; ++y) {
        for (std::ptrdiff_t x = left; x < end; ++x) {
          target[origin + x * right + y * down] = source[y * width + x];
        }
      }
    }
  }
  return result;
}

}  // namespace pelorin::photo
