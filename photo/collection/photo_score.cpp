#include "photo/collection/photo_score.h"

#include <cstdint>
#include <map>
#include <utility>

#include "image_processing/quality/niqe.h"

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

float scoreOf(std::span<const std::uint8_t> file, std::stop_token stop,
              const RowResources& resources, const DecodeLimits& limits) {
  PhotoRows photo(file, {.faces = false, .limits = limits, .stop = std::move(stop)}, resources);
  const auto [width, height] = photo.size();
  return image_processing::analyzeNiqe(width, height, photo.sweep(/*again=*/false)).score;
}

}  // namespace pelorin::photo
