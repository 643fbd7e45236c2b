// Corners of pictures from full of detail to smooth: whole detectors, and the scores of all rows.
#include <benchmark/benchmark.h>

#include <cstdlib>
#include <vector>

#include "bench/features/grey_pictures.h"
#include "bench/support/side_by_side.h"
#include "image_processing/features/fast.h"
#include "image_processing/features/fast_rows.h"

namespace pelorin::bench {
namespace {

constexpr int threshold = 20;

using Detector = xy*(const unsigned char*, int, int, int, int, int*);

template <Detector* detector>
void detect(benchmark::State& state) {
  const auto image = greyPicture(static_cast<GreyPicture>(state.range(0)));
  const int width = static_cast<int>(image.width), height = static_cast<int>(image.height);
  int count = 0;
  sideBySide(state, image, nullptr, [&] {
    xy* const corners = detector(image.data.get(), width, height, width, threshold, &count);
    benchmark::DoNotOptimize(corners);
    std::free(corners);
  });
  state.counters["corners"] = count;
  state.SetLabel(nameOf(static_cast<GreyPicture>(state.range(0))));
}

void scoreRows(benchmark::State& state) {
  const auto image = greyPicture(static_cast<GreyPicture>(state.range(0)));
  std::vector<std::uint8_t> scores(image.width);
  const auto score = [&](auto* scoreRow) {
    for (std::uint32_t y = 3; y < image.height - 3; ++y) {
      benchmark::DoNotOptimize(
          scoreRow(image.row(y), image.width, 3, image.width - 3, 9, threshold, scores.data()));
    }
  };
  sideBySide(
      state, image, [&] { score(image_processing::fastScoreRowScalar); },
      [&] { score(image_processing::fastScoreRow); });
  state.SetLabel(nameOf(static_cast<GreyPicture>(state.range(0))));
}

void onEveryPicture(benchmark::internal::Benchmark* row) {
  row->DenseRange(detail, photo)->UseManualTime()->Iterations(turns)->Unit(benchmark::kMillisecond);
}

BENCHMARK(scoreRows)->Apply(onEveryPicture);
BENCHMARK(detect<fast9_detect>)->Apply(onEveryPicture);
BENCHMARK(detect<fast9_detect_nonmax>)->Apply(onEveryPicture);
BENCHMARK(detect<fast12_detect_nonmax>)->Apply(onEveryPicture);

}  // namespace
}  // namespace pelorin::bench
