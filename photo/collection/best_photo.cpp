#include "photo/collection/best_photo.h"

#include <fmt/format.h>

#include <algorithm>
#include <limits>
#include <tuple>

namespace pelorin::photo {
namespace {

std::string megapixels(const ScannedPhoto& photo) {
  return fmt::format("{:.1f} megapixels", static_cast<double>(photo.pixels()) / 1e6);
}

std::string megabytes(const ScannedPhoto& photo) {
  return fmt::format("{:.2f} MB", static_cast<double>(photo.bytes.value_or(0)) / 1e6);
}

// Never called for two equal scores: with enough digits they differ.
std::string scoresOf(const ScannedPhoto& photo, const ScannedPhoto& other) {
  for (int digits = 1;; ++digits) {
    const std::string score = fmt::format("{:.{}f}", *photo.niqe, digits);
    const std::string otherScore = fmt::format("{:.{}f}", *other.niqe, digits);
    if (score != otherScore) return fmt::format("NIQE {} against {}", score, otherScore);
  }
}

// What the score says where it does not decide; mostly nothing.
std::string andQuality(const ScannedPhoto& photo) {
  if (!photo.niqe) return "";
  return photo.isScored() ? fmt::format(", NIQE {:.1f}", *photo.niqe) : ", too small to score";
}

// A number to rank by, also where there is no score.
float naturalness(const ScannedPhoto& photo) {
  return photo.isScored() ? -*photo.niqe : -std::numeric_limits<float>::infinity();
}

std::string whyBest(const ScannedPhoto& best, const ScannedPhoto& next) {
  if (best.pixels() != next.pixels()) return "the most pixels, " + megapixels(best);
  const std::string among = " among those of " + megapixels(best);
  if (best.isScored() && !next.isScored()) {
    return fmt::format("the only one with a score{}, NIQE {:.1f}", among, *best.niqe);
  }
  if (best.isScored() && *best.niqe != *next.niqe) {
    return "the most natural" + among + ": " + scoresOf(best, next);
  }
  if (best.bytes != next.bytes) {
    return "the largest file, " + megabytes(best) + "," + among + andQuality(best);
  }
  return "the first of those with " + megapixels(best) + " and " + megabytes(best) +
         andQuality(best);
}

std::string whyNot(const ScannedPhoto& photo, const ScannedPhoto& best) {
  if (photo.pixels() != best.pixels()) {
    return "fewer pixels, " + megapixels(photo) + andQuality(photo);
  }
  if (best.isScored() && !photo.isScored()) {
    return photo.niqe ? "as many pixels, too small to score" : "as many pixels, not scored";
  }
  if (best.isScored() && *photo.niqe != *best.niqe) {
    return "as many pixels, less sharp or natural: " + scoresOf(photo, best);
  }
  if (photo.bytes != best.bytes) {
    return "as many pixels, a smaller file, " + megabytes(photo) + andQuality(photo);
  }
  return "as many pixels and bytes, listed later" + andQuality(photo);
}

// References first, by merit, then the others.
std::vector<Ranked> rankBesideReferences(const std::vector<std::size_t>& order,
                                         const std::vector<ScannedPhoto>& photos) {
  const std::uint64_t most = photos[order[0]].pixels();
  std::vector<Ranked> ranking;
  const ScannedPhoto* larger = nullptr;  // the one that no reference stands for
  for (const std::size_t i : order) {
    const ScannedPhoto& photo = photos[i];
    if (photo.isReference) {
      ranking.push_back({i, true, "in a reference folder, " + megapixels(photo)});
    } else if (larger != nullptr) {
      ranking.push_back({i, false, whyNot(photo, *larger)});
    } else if (photo.pixels() > most) {
      larger = &photo;
      ranking.push_back({i, true, "more pixels than any reference, " + megapixels(photo)});
    } else {
      ranking.push_back({i, false, "no more pixels than a reference, " + megapixels(photo)});
    }
  }
  return ranking;
}

}  // namespace

std::vector<Ranked> rankGroup(const DupeGroup& group, const std::vector<ScannedPhoto>& photos) {
  std::vector<std::size_t> order = group.photos;
  const auto merits = [](const ScannedPhoto& photo) {
    return std::tuple(photo.isReference, photo.pixels(), naturalness(photo), photo.bytes);
  };
  std::stable_sort(order.begin(), order.end(), [&](std::size_t a, std::size_t b) {
    return merits(photos[a]) > merits(photos[b]);
  });
  const ScannedPhoto& best = photos[order[0]];
  if (best.isReference) return rankBesideReferences(order, photos);
  std::vector<Ranked> ranking = {{order[0], true, whyBest(best, photos[order[1]])}};
  for (std::size_t i = 1; i < order.size(); ++i) {
    ranking.push_back({order[i], false, whyNot(photos[order[i]], best)});
  }
  return ranking;
}

}  // namespace pelorin::photo
