// Shots with and without times: the search finds the pairs that comparing all finds, and groups are made of
// pairs alone, each photo in one at most.
#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <set>
#include <vector>

#include "image_processing/dupe/green_cdf.h"
#include "photo/collection/grouping.h"
#include "photo/collection/pair_search.h"

using namespace pelorin::photo;

namespace {

void require(bool holds) {
  if (!holds) std::abort();
}

std::vector<Shot> shotsOf(const std::uint8_t* data, std::size_t size) {
  std::vector<Shot> shots;
  constexpr std::size_t bytesOfOne = 6, most = 24;
  for (std::size_t i = 0; i + bytesOfOne <= size && shots.size() < most; i += bytesOfOne) {
    const std::uint8_t* const b = data + i;
    Shot shot;
    pelorin::image_processing::GreenCDF cdf;
    for (std::size_t level = 0; level < cdf.size(); ++level) {
      const float x = static_cast<float>(level + 1) / 256.0f;
      cdf[level] = std::pow(x, 0.5f + static_cast<float>(b[0]) / 64.0f);
    }
    shot.cdf = cdf;
    shot.orientation = 1 + b[1] % 8;
    if (b[2] % 8 != 0) {
      const double clock = b[3] * 60.0 + b[4] / 8.0 + (b[2] % 16 == 1 ? 1e15 : 0);
      shot.time = ShotTime{clock, std::nullopt};
      if (b[5] % 2 == 0) shot.time->utc = clock - 3600.0 * (b[5] / 2 % 24 - 12);
    }
    shots.push_back(shot);
  }
  return shots;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (size == 0) return 0;
  const float threshold = static_cast<float>(data[0]) / 32.0f - 4.0f;
  const std::vector<Shot> shots = shotsOf(data + 1, size - 1);
  std::vector<ShotPair> all;
  for (std::size_t first = 0; first < shots.size(); ++first) {
    for (std::size_t second = first + 1; second < shots.size(); ++second) {
      ShotPair pair = compareShots(shots[first], shots[second]);
      pair.first = first;
      pair.second = second;
      if (pair.score >= threshold) all.push_back(pair);
    }
  }
  const std::vector<ShotPair> found = findPairs(shots, threshold);
  require(found == all);

  std::set<std::size_t> grouped;
  for (const DupeGroup& group : groupWholly(shots.size(), found)) {
    require(group.photos.size() >= 2 && std::ranges::is_sorted(group.photos));
    require(group.pairs.size() == group.photos.size() * (group.photos.size() - 1) / 2);
    for (const std::size_t photo : group.photos) require(grouped.insert(photo).second);
    for (const ShotPair& pair : group.pairs) {
      require(std::ranges::binary_search(group.photos, pair.first));
      require(std::ranges::binary_search(group.photos, pair.second));
    }
  }
  return 0;
}
