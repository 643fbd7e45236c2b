// dupe_thresholds [PHOTO...]: how the duplicate score parts true pairs from false ones, as the tables
// of docs/duplicates.md. The scenes are the photos, or generated pictures where none are named.
#include <fmt/format.h>

#include <algorithm>
#include <cstdio>
#include <exception>
#include <vector>

#include "image_processing/dupe/dupe_score.h"
#include "photo/area_average.h"
#include "photo/file_io.h"
#include "photo/photo.h"
#include "tests/photo/collection/pair_samples.h"
#include "tests/support/pictures.h"

namespace pelorin::bench {
namespace {

using test_support::PairSamples;
using test_support::Picture;

constexpr std::uint32_t longestSide = 1600;

std::vector<Picture> scenesOf(const std::vector<std::string>& photos) {
  std::vector<Picture> scenes;
  for (const std::string& path : photos) {
    const photo::Photo photo = photo::open(photo::readFile(path));
    const photo::PictureSize size =
        photo::fitWithin({photo.image->width, photo.image->height}, {longestSide, longestSide});
    scenes.push_back(photo::areaAverage(*photo.image, size));
  }
  for (std::uint64_t seed = 0; photos.empty() && seed < 24; ++seed) {
    scenes.push_back(test_support::photoLikePicture(1024, 768, seed));
  }
  return scenes;
}

/// The value that `share` of them do not exceed.
float quantile(std::vector<float> values, double share) {
  std::sort(values.begin(), values.end());
  return values[static_cast<std::size_t>(share * static_cast<double>(values.size() - 1) + 0.5)];
}

void printDistributions(const std::vector<PairSamples>& samples) {
  fmt::print(
      "| Pairs | Count | Least | 5 % | Median | 95 % | Most | Distance: median | 95 % |\n"
      "|---|---:|---:|---:|---:|---:|---:|---:|---:|\n");
  for (const PairSamples& kind : samples) {
    std::vector<float> scores, distances;
    for (const photo::ShotPair& pair : kind.pairs) {
      scores.push_back(pair.score);
      distances.push_back(pair.distance);
    }
    fmt::print("| {}{} | {} |", kind.isDuplicate ? "" : "false: ", kind.name, kind.pairs.size());
    for (const double share : {0.0, 0.05, 0.5, 0.95, 1.0}) {
      fmt::print(" {:.2f} |", quantile(scores, share));
    }
    fmt::print(" {:.3f} | {:.3f} |\n", quantile(distances, 0.5), quantile(distances, 0.95));
  }
}

/// Of the pairs of a kind, the share that reaches a threshold.
template <typename Score>
double shareFound(const PairSamples& kind, float threshold, Score scoreOf) {
  const auto found =
      std::count_if(kind.pairs.begin(), kind.pairs.end(),
                    [&](const photo::ShotPair& pair) { return scoreOf(pair) >= threshold; });
  return static_cast<double>(found) / static_cast<double>(kind.pairs.size());
}

// Each kind counts the same, however many pairs of it there are: half of all true, half false.
template <typename Score>
void printThresholds(const std::vector<PairSamples>& samples, const std::vector<float>& thresholds,
                     Score scoreOf) {
  fmt::print(
      "| Threshold | True pairs found | False pairs found | Precision |\n"
      "|---:|---:|---:|---:|\n");
  for (const float threshold : thresholds) {
    double found[2] = {0, 0}, kinds[2] = {0, 0};
    for (const PairSamples& kind : samples) {
      found[kind.isDuplicate] += shareFound(kind, threshold, scoreOf);
      ++kinds[kind.isDuplicate];
    }
    const double recall = found[true] / kinds[true], alarms = found[false] / kinds[false];
    fmt::print("| {:.2f} | {:.1f} % | {:.1f} % | {:.1f} % |\n", threshold, 100 * recall,
               100 * alarms, recall > 0 ? 100 * recall / (recall + alarms) : 0.0);
  }
}

void run(const std::vector<std::string>& photos) {
  const std::vector<PairSamples> samples = test_support::pairSamples(scenesOf(photos));
  printDistributions(samples);
  fmt::print("\nWith times:\n\n");
  printThresholds(samples, {0.0f, 0.25f, 0.5f, 0.75f, 1.0f, 1.25f, 1.5f, 2.0f},
                  [](const photo::ShotPair& pair) { return pair.score; });
  fmt::print("\nWithout, copies of one shot against the rest:\n\n");
  std::vector<PairSamples> alike = samples;
  for (PairSamples& kind : alike) kind.isDuplicate = kind.isCopy;
  std::erase_if(alike, [&](const PairSamples& kind) {
    return !kind.isCopy && (kind.name.starts_with("burst") || !kind.name.ends_with(" 3 s"));
  });
  printThresholds(alike, {2.0f, 2.5f, 2.75f, 3.0f, 3.1f, 3.2f, 3.3f, 3.4f, 3.5f},
                  [](const photo::ShotPair& pair) {
                    return image_processing::dupeScoreOfDistance(pair.distance, 0,
                                                                 pair.sameOrientation);
                  });
}

}  // namespace
}  // namespace pelorin::bench

int main(int argc, char** argv) {
  try {
    pelorin::bench::run({argv + 1, argv + argc});
  } catch (const std::exception& error) {
    std::fprintf(stderr, "dupe_thresholds: %s\n", error.what());
    return 1;
  }
  return 0;
}
