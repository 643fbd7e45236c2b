// Corners with scores: those that are kept score higher than all their neighbours, in whatever order, ties and
// places; in another than raster order there are none.
#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <vector>

#include "fuzz/bytes.h"
#include "image_processing/features/fast.h"

namespace {

bool areNeighbours(const xy& a, const xy& b) {
  const std::int64_t dx = std::int64_t{a.x} - b.x, dy = std::int64_t{a.y} - b.y;
  return dx >= -1 && dx <= 1 && dy >= -1 && dy <= 1;
}

bool comesBefore(const xy& a, const xy& b) {
  return a.y != b.y ? a.y < b.y : a.x < b.x;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  Bytes bytes(data, size);
  const std::uint8_t kind = bytes.next();
  const auto place = [&] {
    return (kind & 1) != 0 ? bytes.next<std::int32_t>() : std::int32_t{bytes.next()} % 16 - 4;
  };
  std::vector<xy> corners;
  while (!bytes.empty() && corners.size() < 300) corners.push_back({place(), place()});
  const bool isSorted = (kind & 6) != 0;
  if (isSorted) {
    std::sort(corners.begin(), corners.end(), comesBefore);
    const auto same = [](const xy& a, const xy& b) { return a.x == b.x && a.y == b.y; };
    corners.erase(std::unique(corners.begin(), corners.end(), same), corners.end());
  }
  std::vector<int> scores;
  for (std::size_t i = 0; i < corners.size(); ++i) {
    scores.push_back((kind & 8) != 0 ? static_cast<int>(i * 2654435761u) : data[i % size] % 5);
  }

  const int count = static_cast<int>(corners.size());
  int kept = -1;
  xy* const maxima = nonmax_suppression(corners.data(), scores.data(), count, &kept);
  const bool isInOrder = std::is_sorted(corners.begin(), corners.end(), comesBefore);
  // Of corners that stand at one place twice, no more is promised than that they are safe.
  const auto isSame = [](const xy& a, const xy& b) { return a.x == b.x && a.y == b.y; };
  if (std::adjacent_find(corners.begin(), corners.end(), isSame) != corners.end()) {
    std::free(maxima);
    return 0;
  }
  if ((maxima == nullptr) != (count == 0 || !isInOrder)) std::abort();
  std::vector<xy> expected;
  for (std::size_t i = 0; maxima != nullptr && i < corners.size(); ++i) {
    bool isHighest = true;
    for (std::size_t j = 0; j < corners.size(); ++j) {
      isHighest &= i == j || !areNeighbours(corners[i], corners[j]) || scores[j] < scores[i];
    }
    if (isHighest) expected.push_back(corners[i]);
  }
  if (kept != static_cast<int>(expected.size())) std::abort();
  for (int i = 0; i < kept; ++i) {
    if (maxima[i].x != expected[i].x || maxima[i].y != expected[i].y) std::abort();
  }
  std::free(maxima);
  return 0;
}
