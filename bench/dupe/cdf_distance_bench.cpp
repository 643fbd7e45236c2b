#include <benchmark/benchmark.h>

#include <vector>

#include "image_processing/dupe/cdf_distance.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

// Every pair of 16 photos: different gains, both directions.
void distance(benchmark::State& state) {
  std::vector<GreenCDF> cdfs(16);
  for (std::size_t i = 0; i < cdfs.size(); ++i) {
    computeGreenCDF(test_support::photoLikePicture(200, 150, i), cdfs[i]);
  }
  std::size_t pair = 0;
  for (auto _ : state) {
    benchmark::DoNotOptimize(exposureInvariantCDFDistance(cdfs[pair / 16 % 16], cdfs[pair % 16]));
    ++pair;
  }
  state.SetItemsProcessed(state.iterations());
}
BENCHMARK(distance);

}  // namespace
}  // namespace pelorin::image_processing
