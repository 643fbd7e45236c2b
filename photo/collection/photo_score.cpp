#include "photo/collection/photo_score.h"

#include <cstdint>
#include <map>
#include <utility>

#include "image_processing/quality/niqe.h"
#include "photo/photo.h"

namespace pelorin::photo {

std::vector<std::size_t> photosToScore(const std::vector<DupeGroup>& groups,
                                       const std::vector<ScannedPhoto>& photos) {
  std::vector<std::size_t> needed;
  for (const DupeGroup& group : groups) {
    std::map<std::uint64_t, int> countOfSize;
    for (const std::size_t i : group.photos) ++countOfSize[photos[i].pixels()];
    for (const std::size_t i : group.photos) {
      if (countOfSize[photos[i].pixels()] > 1) needed.push_back(i);
    }
  }
  return needed;
}

float scoreOf(std::span<const std::uint8_t> file, std::stop_token stop) {
  return image_processing::niqeMetric(*open(file, {.stop = std::move(stop)}).image);
}

}  // namespace pelorin::photo
