#include "cli/dupes/best_photo.h"

#include <fmt/format.h>

#include <algorithm>
#include <tuple>

namespace pelorin::cli {
namespace {

std::string megapixels(const ScannedPhoto& photo) {
  return fmt::format("{:.1f} megapixels", static_cast<double>(photo.pixels()) / 1e6);
}

std::string megabytes(const ScannedPhoto& photo) {
  return fmt::format("{:.2f} MB", static_cast<double>(photo.bytes.value_or(0)) / 1e6);
}

std::string whyBest(const ScannedPhoto& best, const ScannedPhoto& next) {
  if (best.pixels() != next.pixels()) return "the most pixels, " + megapixels(best);
  if (best.bytes != next.bytes) {
    return "the largest file, " + megabytes(best) + ", among those of " + megapixels(best);
  }
  return "the first of those with " + megapixels(best) + " and " + megabytes(best);
}

std::string whyNot(const ScannedPhoto& photo, const ScannedPhoto& best) {
  if (photo.pixels() != best.pixels()) return "fewer pixels, " + megapixels(photo);
  if (photo.bytes != best.bytes) return "as many pixels, a smaller file, " + megabytes(photo);
  return "as many pixels and bytes, listed later";
}

}  // namespace

std::vector<Ranked> rankGroup(const DupeGroup& group, const std::vector<ScannedPhoto>& photos) {
  std::vector<std::size_t> order = group.photos;
  std::stable_sort(order.begin(), order.end(), [&](std::size_t a, std::size_t b) {
    return std::tuple(photos[a].pixels(), photos[a].bytes) >
           std::tuple(photos[b].pixels(), photos[b].bytes);
  });
  const ScannedPhoto& best = photos[order[0]];
  std::vector<Ranked> ranking = {{order[0], whyBest(best, photos[order[1]])}};
  for (std::size_t i = 1; i < order.size(); ++i) {
    ranking.push_back({order[i], whyNot(photos[order[i]], best)});
  }
  return ranking;
}

}  // namespace pelorin::cli
