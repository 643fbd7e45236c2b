#include <cmath>
#include <limits>
#include <vector>

#include "bindings/c/given_array.h"
#include "bindings/c/photos.h"
#include "bindings/c/pixels.h"
#include "image_processing/dupe/cdf_distance.h"
#include "image_processing/dupe/dupe_score.h"
#include "photo/collection/grouping.h"
#include "photo/collection/pair_search.h"
#include "photo/collection/photo_record.h"

using namespace pelorin;
using namespace pelorin::c_api;
using image_processing::GreenCDF;

namespace {

GreenCDF cdfOf(const float* values, const char* name) {
  required(values, name);
  GreenCDF cdf;
  std::copy_n(values, cdf.size(), cdf.begin());
  return cdf;
}

void requireNumber(float threshold) {
  if (std::isnan(threshold)) refuse("threshold", "is no number");
}

photo::Shot shotOf(const quenby_shot& given) {
  if (std::isinf(given.wall_clock) || std::isinf(given.utc)) refuse("shots", "a time is infinite");
  photo::Shot shot{{cdfOf(given.green_cdf, "shots"), given.pixel_count}, given.orientation, {}};
  if (std::isnan(given.wall_clock)) return shot;
  shot.time = photo::ShotTime{given.wall_clock, {}};
  if (!std::isnan(given.utc)) shot.time->utc = given.utc;
  return shot;
}

quenby_pair pairOf(const photo::ShotPair& pair) {
  return {pair.first,    pair.second,     pair.seconds,        pair.score,
          pair.distance, pair.timesKnown, pair.sameOrientation};
}

}  // namespace

int32_t quenby_green_cdf(const quenby_pixels* pixels, float* green_cdf, quenby_error* error) {
  return guarded(error, [&] {
    required(green_cdf, "green_cdf");
    GreenCDF cdf;
    computeGreenCDF(*viewOf(pixels), cdf);
    std::copy(cdf.begin(), cdf.end(), green_cdf);
  });
}

int32_t quenby_read_shot(const uint8_t* file, size_t size, const quenby_open_options* options,
                         const quenby_cancel* cancel, quenby_shot* shot, quenby_error* error) {
  return guarded(error, [&] {
    required(shot, "shot");
    const photo::OpenOptions open = openOptions(options, cancel);
    const photo::PhotoRecord record =
        photo::readPhotoRecord(bytesOf(file, size), photo::automaticScale, open.stop, open.limits);
    constexpr double unknown = std::numeric_limits<double>::quiet_NaN();
    const std::uint64_t pixels =
        photo::countedPixels(record.width, record.height, photo::automaticScale);
    const bool fits = pixels <= std::numeric_limits<std::uint32_t>::max();
    quenby_shot read{
        {}, record.orientation, fits ? static_cast<std::uint32_t>(pixels) : 0, unknown, unknown};
    const GreenCDF cdf = record.cdf.unpacked();
    std::copy(cdf.begin(), cdf.end(), read.green_cdf);
    if (record.captureTime) {
      const photo::ShotTime time = photo::shotTime(*record.captureTime);
      read.wall_clock = time.wallClock;
      read.utc = time.utc.value_or(unknown);
    }
    *shot = read;
  });
}

int32_t quenby_distance(const float* a, const float* b, float* distance, quenby_error* error) {
  return guarded(error, [&] {
    required(distance, "distance") =
        image_processing::exposureInvariantCDFDistance(cdfOf(a, "a"), cdfOf(b, "b"));
  });
}

int32_t quenby_dupe_score(float distance, double seconds, int32_t same_orientation, float* score,
                          quenby_error* error) {
  return guarded(error, [&] {
    required(score, "score") = image_processing::dupeScoreOfDistance(
        distance, static_cast<float>(std::fabs(seconds)), same_orientation != 0);
  });
}

int32_t quenby_dupe_window(float threshold, int32_t same_orientation, double* seconds,
                           quenby_error* error) {
  return guarded(error, [&] {
    required(seconds, "seconds");
    requireNumber(threshold);
    *seconds = image_processing::longestDupeTimeDifference(threshold, same_orientation != 0);
  });
}

int32_t quenby_find_pairs(const quenby_shot* shots, size_t count, float threshold,
                          const quenby_cancel* cancel, quenby_pairs* pairs, quenby_error* error) {
  if (pairs != nullptr) *pairs = {};
  return guarded(error, [&] {
    required(pairs, "pairs");
    requireNumber(threshold);
    array(shots, count, "shots");
    std::vector<photo::Shot> all;
    all.reserve(count);
    for (size_t i = 0; i < count; ++i) all.push_back(shotOf(shots[i]));
    const photo::PairSearch search(all, threshold);
    photo::PreparedShots prepared(all);
    std::vector<photo::ShotPair> found;
    for (size_t step = 0; step < search.stepCount(); ++step) {
      photo::stopIfAsked(tokenOf(cancel));
      search.run(step, prepared, found);
    }
    sortPairs(found);
    std::vector<quenby_pair> given;
    given.reserve(found.size());
    for (const photo::ShotPair& pair : found) given.push_back(pairOf(pair));
    *pairs = {givenArray<quenby_pair>(given), given.size()};
  });
}

void quenby_pairs_free(quenby_pairs* pairs) {
  freeArray(pairs);
}

int32_t quenby_group_pairs(const quenby_pair* pairs, size_t pair_count, size_t shot_count,
                           uint64_t* first_of, quenby_error* error) {
  return guarded(error, [&] {
    array(pairs, pair_count, "pairs");
    array(first_of, shot_count, "first_of");
    std::vector<photo::ShotPair> ties(pair_count);
    for (size_t i = 0; i < pair_count; ++i) {
      if (pairs[i].second >= shot_count || pairs[i].first >= pairs[i].second) {
        refuse("pairs", "places are not in order, below the number of shots");
      }
      if (std::isnan(pairs[i].score)) refuse("pairs", "a score is no number");
      ties[i].first = static_cast<size_t>(pairs[i].first);
      ties[i].second = static_cast<size_t>(pairs[i].second);
      ties[i].score = pairs[i].score;
    }
    const std::vector<photo::DupeGroup> groups = photo::groupWholly(shot_count, ties);
    for (size_t i = 0; i < shot_count; ++i) first_of[i] = i;
    for (const photo::DupeGroup& group : groups) {
      for (const size_t photo : group.photos) first_of[photo] = group.photos.front();
    }
  });
}
