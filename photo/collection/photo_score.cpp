#include "photo/collection/photo_score.h"

#include <cstdint>
#include <map>

#include "cli/frame/interrupt.h"
#include "image_processing/quality/niqe.h"
#include "photo/photo.h"

namespace pelorin::cli {

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

float scoreOf(const Input& input) {
  stopIfInterrupted();
  const Photo photo = loadPhoto(input, {});
  stopIfInterrupted();
  return image_processing::niqeMetric(*photo.image);
}

}  // namespace pelorin::cli
