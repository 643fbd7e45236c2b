#include "photo/collection/pair_search.h"

#include <algorithm>
#include <tuple>

#include "image_processing/dupe/cdf_distance.h"
#include "image_processing/dupe/dupe_score.h"

namespace pelorin::photo {

namespace {

using image_processing::PreparedCDF;

// More than what is mostly near in time; beside a thread's other data in a cache of half a megabyte or more.
constexpr std::size_t preparedAtOnce = 256;

ShotPair pairOf(const Shot& a, const Shot& b, float distance) {
  ShotPair pair{};
  pair.timesKnown = a.time && b.time;
  pair.seconds = pair.timesKnown ? secondsBetween(*a.time, *b.time) : 0.0;
  pair.sameOrientation = a.orientation == b.orientation;
  pair.distance = distance;
  pair.score = image_processing::dupeScoreOfDistance(
      pair.distance, static_cast<float>(pair.seconds), pair.sameOrientation);
  return pair;
}

}  // namespace

PreparedShots::PreparedShots(std::span<const Shot> shots)
    : shots_(shots), slots_(std::min(shots.size(), preparedAtOnce)) {}

const PreparedCDF& PreparedShots::of(std::size_t shot) {
  std::optional<Slot>& slot = slots_[shot % slots_.size()];
  if (!slot || slot->shot != shot)
    slot.emplace(Slot{shot, PreparedCDF(shots_[shot].cdf.unpacked())});
  return slot->cdf;
}

ShotPair compareShots(const Shot& a, const Shot& b) {
  return pairOf(a, b,
                image_processing::exposureInvariantCDFDistance(a.cdf.unpacked(), b.cdf.unpacked()));
}

PairSearch::PairSearch(std::span<const Shot> shots, float threshold, bool compareUntimed)
    : shots_(shots), threshold_(threshold) {
  for (const bool same : {false, true}) {
    longestBetween_[same] = image_processing::longestDupeTimeDifference(threshold, same);
  }
  longest_ = std::max(longestBetween_[false], longestBetween_[true]);
  for (std::size_t i = 0; i < shots.size(); ++i) {
    const std::optional<ShotTime>& time = shots[i].time;
    if (!time && compareUntimed) untimed_.push_back(i);
    if (time) byWallClock_.push_back({time->wallClock, i});
    if (time && time->utc) byUTC_.push_back({*time->utc, i});
  }
  sortByTime(byUTC_);
  sortByTime(byWallClock_);
}

void PairSearch::sortByTime(Timeline& timeline) {
  std::sort(timeline.begin(), timeline.end(), [](const Moment& a, const Moment& b) {
    return std::tie(a.seconds, a.shot) < std::tie(b.seconds, b.shot);
  });
}

/// The comparisons of one shot with others.
class PairSearch::Step {
 public:
  Step(const PairSearch& search, std::size_t shot, PreparedShots& prepared,
       std::vector<ShotPair>& found)
      : search_(search), shot_(shot), prepared_(prepared), found_(found) {}

  void compareWith(std::size_t other) {
    const auto [first, second] = std::minmax(shot_, other);
    const Shot &a = search_.shots_[first], &b = search_.shots_[second];
    // The cheap half of the score first.
    const double seconds = a.time && b.time ? secondsBetween(*a.time, *b.time) : 0.0;
    if (!(seconds <= search_.longestBetween_[a.orientation == b.orientation])) return;
    if (!own_) own_ = prepared_.of(shot_);
    const PreparedCDF& others = prepared_.of(other);
    const float distance = shot_ < other
                               ? image_processing::exposureInvariantCDFDistance(*own_, others)
                               : image_processing::exposureInvariantCDFDistance(others, *own_);
    ShotPair pair = pairOf(a, b, distance);
    pair.first = first;
    pair.second = second;
    if (pair.score >= search_.threshold_) found_.push_back(pair);
  }

 private:
  const PairSearch& search_;
  std::size_t shot_;
  PreparedShots& prepared_;
  std::vector<ShotPair>& found_;
  std::optional<PreparedCDF> own_;  // the other may be in need of its slot
};

void PairSearch::run(std::size_t step, PreparedShots& prepared,
                     std::vector<ShotPair>& found) const {
  if (step < untimed_.size()) {
    const std::size_t shot = untimed_[step];
    Step comparisons(*this, shot, prepared, found);
    for (std::size_t other = 0; other < shots_.size(); ++other) {
      if (shots_[other].time || other > shot) comparisons.compareWith(other);
    }
    return;
  }
  step -= untimed_.size();

  const auto isNear = [this](const Moment& a, const Moment& b) {
    return std::fabs(a.seconds - b.seconds) <= longest_;
  };
  if (step < byUTC_.size()) {
    Step comparisons(*this, byUTC_[step].shot, prepared, found);
    for (std::size_t i = step + 1; i < byUTC_.size() && isNear(byUTC_[step], byUTC_[i]); ++i) {
      comparisons.compareWith(byUTC_[i].shot);
    }
    return;
  }
  step -= byUTC_.size();

  // The wall clock counts where one of the two offsets is not known: a shot without one meets
  // those with one on both sides, and those without on one side, so that they meet once.
  const Moment& moment = byWallClock_[step];
  const auto hasUTC = [this](const Moment& m) { return shots_[m.shot].time->utc.has_value(); };
  if (hasUTC(moment)) return;
  Step comparisons(*this, moment.shot, prepared, found);
  for (std::size_t i = step; i-- > 0 && isNear(moment, byWallClock_[i]);) {
    if (hasUTC(byWallClock_[i])) comparisons.compareWith(byWallClock_[i].shot);
  }
  for (std::size_t i = step + 1; i < byWallClock_.size() && isNear(moment, byWallClock_[i]); ++i) {
    comparisons.compareWith(byWallClock_[i].shot);
  }
}

void sortPairs(std::vector<ShotPair>& pairs) {
  std::sort(pairs.begin(), pairs.end(), [](const ShotPair& a, const ShotPair& b) {
    return std::tie(a.first, a.second) < std::tie(b.first, b.second);
  });
}

std::vector<ShotPair> findPairs(std::span<const Shot> shots, float threshold) {
  const PairSearch search(shots, threshold);
  PreparedShots prepared(shots);
  std::vector<ShotPair> pairs;
  for (std::size_t step = 0; step < search.stepCount(); ++step) search.run(step, prepared, pairs);
  sortPairs(pairs);
  return pairs;
}

}  // namespace pelorin::photo
