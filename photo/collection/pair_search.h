#pragma once

#include <cstddef>
#include <optional>
#include <span>
#include <vector>

#include "image_processing/dupe/prepared_cdf.h"
#include "photo/collection/shot.h"

namespace pelorin::photo {

/// Two shots and what they have in common.
struct ShotPair {
  std::size_t first, second;  ///< Places in the searched list, first < second.
  float score;
  float distance;
  double seconds;  ///< Between them; 0 where not both times are known.
  bool timesKnown;
  bool sameOrientation;

  friend bool operator==(const ShotPair&, const ShotPair&) = default;
};

/// The least score of near-duplicates where nobody says another, measured on pairs of both kinds
/// (docs/duplicates.md): of seconds between true pairs and as many false ones, four of five true pairs
/// reach it, and 24 of 25 that reach it are true.
constexpr float leastDupeScore = 1.5f;

/// The same where a time is not known and the time between is taken as 0, so that looks alone speak:
/// little but copies of one shot reaches it.
constexpr float leastLookAlikeScore = 3.5f;

/// The distributions of shots that were compared last, ready to be compared again: what makes them so
/// takes longer than a comparison. For one thread and one search.
class PreparedShots {
 public:
  explicit PreparedShots(std::span<const Shot> shots);

  /// The distribution of shot `shot`, until the next call.
  const image_processing::PreparedCDF& of(std::size_t shot);

 private:
  struct Slot {
    std::size_t shot;
    image_processing::PreparedCDF cdf;
  };
  std::span<const Shot> shots_;
  std::vector<std::optional<Slot>> slots_;  ///< Each for the shots of one remainder.
};

/// What `a` and `b` have in common; `first` and `second` are left 0.
ShotPair compareShots(const Shot& a, const Shot& b);

/// Finds all pairs that reach a threshold without comparing all: the score bounds the time between
/// near-duplicates, so that it is enough to look around each shot in the order of their times.
/// Shots without a time are left out or compared with every other, the time between taken as 0.
///
/// The work comes in independent steps, which any threads may share in any order: n log n in all
/// where shots without a time are few and no more than so many are taken at once.
class PairSearch {
 public:
  /// @param shots           kept by reference.
  /// @param threshold       smallest score of a pair; not NaN.
  /// @param compareUntimed  whether shots without a time take part.
  PairSearch(std::span<const Shot> shots, float threshold, bool compareUntimed = true);

  std::size_t stepCount() const { return untimed_.size() + byUTC_.size() + byWallClock_.size(); }

  /// Appends what step `step` (below `stepCount`) finds; every pair is found by exactly one step.
  /// @param prepared  of the searched shots, one for each thread; steps that follow one another
  ///                  mostly find there what they need.
  void run(std::size_t step, PreparedShots& prepared, std::vector<ShotPair>& found) const;

 private:
  struct Moment {
    double seconds;
    std::size_t shot;
  };
  using Timeline = std::vector<Moment>;

  static void sortByTime(Timeline& timeline);
  class Step;

  std::span<const Shot> shots_;
  float threshold_;
  double longestBetween_[2];  ///< Seconds, by whether the orientations are the same.
  double longest_;
  std::vector<std::size_t> untimed_;
  Timeline byUTC_;        ///< The shots whose UTC is known.
  Timeline byWallClock_;  ///< All shots with a time.
};

/// All pairs that reach `threshold`, by `first`, then `second`: every step, in this thread.
std::vector<ShotPair> findPairs(std::span<const Shot> shots, float threshold);

/// Brings pairs into the order of `findPairs`.
void sortPairs(std::vector<ShotPair>& pairs);

}  // namespace pelorin::photo
