#include <benchmark/benchmark.h>
#include <sys/resource.h>

#include <map>

#include "photo/collection/pair_search.h"
#include "tests/photo/collection/synthetic_shots.h"

namespace pelorin::photo {
namespace {

// One library after the other, each with as many photos an hour as any.
const std::vector<Shot>& library(std::size_t count) {
  static std::map<std::size_t, std::vector<Shot>> libraries;
  if (!libraries.contains(count)) {
    libraries.clear();
    libraries[count] = test_support::syntheticShots(count, {}, count);
  }
  return libraries[count];
}

double peakMegabytes() {
  rusage usage{};
  getrusage(RUSAGE_SELF, &usage);
  return static_cast<double>(usage.ru_maxrss) / 1024.0;
}

double megabytesOf(const std::vector<Shot>& shots) {
  std::size_t bytes = shots.size() * sizeof(Shot);
  for (const Shot& shot : shots) bytes += shot.cdf.byteCount();
  return static_cast<double>(bytes) / 1e6;
}

void findPairsOfALibrary(benchmark::State& state) {
  const std::vector<Shot>& shots = library(static_cast<std::size_t>(state.range(0)));
  std::size_t pairs = 0;
  for (auto _ : state) pairs = findPairs(shots, 0.0f).size();
  state.SetComplexityN(state.range(0));
  state.counters["pairs"] = static_cast<double>(pairs);
  state.counters["shots_MB"] = megabytesOf(shots);
  state.counters["peak_MiB"] = peakMegabytes();  // of the process so far, the shots included
}
BENCHMARK(findPairsOfALibrary)
    ->RangeMultiplier(10)
    ->Range(1000, 1'000'000)
    ->Unit(benchmark::kMillisecond)
    ->Complexity(benchmark::oNLogN);

}  // namespace
}  // namespace pelorin::photo
