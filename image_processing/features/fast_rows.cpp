#include "image_processing/features/fast_rows.h"

#include <algorithm>

#include "image_processing/features/fast_corner.h"

namespace pelorin::image_processing {

bool fastScoreRowScalar(const std::uint8_t* row, std::ptrdiff_t stride, std::size_t begin,
                        std::size_t end, int arc, int threshold, std::uint8_t* scores) {
  bool any = false;
  for (std::size_t x = begin; x < end; ++x) {
    const CircleValues circle = circleAround(row + x, stride);
    const bool corner = isCorner(row[x], circle, arc, threshold);
    const int score = corner ? cornerScoreScalar(row[x], circle, arc, threshold) + 1 : 0;
    scores[x] = static_cast<std::uint8_t>(score);
    any = any || corner;
  }
  return any;
}

std::size_t fastListCornersScalar(const std::uint8_t* scores, std::size_t begin, std::size_t end,
                                  int y, xy* corners) {
  std::size_t count = 0;
  for (std::size_t x = begin; x < end; ++x) {
    if (scores[x] != 0) corners[count++] = {static_cast<int>(x), y};
  }
  return count;
}

std::size_t fastListMaximaScalar(const std::uint8_t* above, const std::uint8_t* scores,
                                 const std::uint8_t* below, std::size_t begin, std::size_t end,
                                 int y, xy* corners) {
  std::size_t count = 0;
  for (std::size_t x = begin; x < end; ++x) {
    const std::uint8_t score = scores[x];
    const std::uint8_t neighbour = std::max({above[x - 1], above[x], above[x + 1], scores[x - 1],
                                             scores[x + 1], below[x - 1], below[x], below[x + 1]});
    if (score > neighbour) corners[count++] = {static_cast<int>(x), y};
  }
  return count;
}

}  // namespace pelorin::image_processing
