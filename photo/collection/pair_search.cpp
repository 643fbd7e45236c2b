#include "photo/collection/pair_search.h"

#include <algorithm>
#include <tuple>

#include "image_processing/dupe/cdf_distance.h"
#include "image_processing/dupe/dupe_score.h"

namespace pelorin::photo {

ShotPair compareShots(const Shot& a, const Shot& b) {
  ShotPair pair{};
  pair.timesKnown = a.time && b.time;
  pair.seconds = pair.timesKnown ? secondsBetween(*a.time, *b.time) : 0.0;
  pair.sameOrientation = a.orientation == b.orientation;
  pair.distance = image_processing::exposureInvariantCDFDistance(a.cdf, b.cdf);
  pair.score = image_processing::dupeScoreOfDistance(
      pair.distance, static_cast<float>(pair.seconds), pair.sameOrientation);
  return pair;
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

void PairSearch::compare(std::size_t a, std::size_t b, std::vector<ShotPair>& found) const {
  const auto [first, second] = std::minmax(a, b);
  const Shot &one = shots_[first], &other = shots_[second];
  // The cheap half of the score first.
  const double seconds = one.time && other.time ? secondsBetween(*one.time, *other.time) : 0.0;
  if (!(seconds <= longestBetween_[one.orientation == other.orientation])) return;
  ShotPair pair = compareShots(one, other);
  pair.first = first;
  pair.second = second;
  if (pair.score >= threshold_) found.push_back(pair);
}

void PairSearch::run(std::size_t step, std::vector<ShotPair>& found) const {
  if (step < untimed_.size()) {
    const std::size_t shot = untimed_[step];
    for (std::size_t other = 0; other < shots_.size(); ++other) {
      if (shots_[other].time || other > shot) compare(shot, other, found);
    }
    return;
  }
  step -= untimed_.size();

  const auto isNear = [this](const Moment& a, const Moment& b) {
    return std::fabs(a.seconds - b.seconds) <= longest_;
  };
  if (step < byUTC_.size()) {
    for (std::size_t i = step + 1; i < byUTC_.size() && isNear(byUTC_[step], byUTC_[i]); ++i) {
      compare(byUTC_[step].shot, byUTC_[i].shot, found);
    }
    return;
  }
  step -= byUTC_.size();

  // The wall clock counts where one of the two offsets is not known: a shot without one meets
  // those with one on both sides, and those without on one side, so that they meet once.
  const Moment& moment = byWallClock_[step];
  const auto hasUTC = [this](const Moment& m) { return shots_[m.shot].time->utc.has_value(); };
  if (hasUTC(moment)) return;
  for (std::size_t i = step; i-- > 0 && isNear(moment, byWallClock_[i]);) {
    if (hasUTC(byWallClock_[i])) compare(moment.shot, byWallClock_[i].shot, found);
  }
  for (std::size_t i = step + 1; i < byWallClock_.size() && isNear(moment, byWallClock_[i]); ++i) {
    compare(moment.shot, byWallClock_[i].shot, found);
  }
}

void sortPairs(std::vector<ShotPair>& pairs) {
  std::sort(pairs.begin(), pairs.end(), [](const ShotPair& a, const ShotPair& b) {
    return std::tie(a.first, a.second) < std::tie(b.first, b.second);
  });
}

std::vector<ShotPair> findPairs(std::span<const Shot> shots, float threshold) {
  const PairSearch search(shots, threshold);
  std::vector<ShotPair> pairs;
  for (std::size_t step = 0; step < search.stepCount(); ++step) search.run(step, pairs);
  sortPairs(pairs);
  return pairs;
}

}  // namespace pelorin::photo
