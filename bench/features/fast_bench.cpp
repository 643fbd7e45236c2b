#include <benchmark/benchmark.h>

#include <cstdlib>
#include <vector>

#include "bench/features/grey_pictures.h"
#include "bench/support/per_pixel.h"
#include "image_processing/features/fast.h"
#include "image_processing/features/fast_rows.h"

namespace pelorin::bench {
namespace {

constexpr int threshold = 20;

void finish(benchmark::State& state, const image_processing::Image<unsigned char>& image) {
  reportPerPixel(state, image.pixelCount());
  state.SetLabel(nameOf(static_cast<GreyPicture>(state.range(0))));
}

using Detector = xy*(const unsigned char*, int, int, int, int, int*);

template <Detector* detector>
void detect(benchmark::State& state) {
  const auto image = greyPicture(static_cast<GreyPicture>(state.range(0)));
  const int width = static_cast<int>(image.width), height = static_cast<int>(image.height);
  int count = 0;
  for (auto _ : state) {
    xy* const corners = detector(image.data.get(), width, height, width, threshold, &count);
    benchmark::DoNotOptimize(corners);
    std::free(corners);
  }
  state.counters["corners"] = count;
  finish(state, image);
}

using RowScorer = decltype(image_processing::fastScoreRow);

template <RowScorer* scorer>
void scoreRows(benchmark::State& state) {
  const auto image = greyPicture(static_cast<GreyPicture>(state.range(0)));
  std::vector<std::uint8_t> scores(image.width);
  for (auto _ : state) {
    for (std::uint32_t y = 3; y < image.height - 3; ++y) {
      benchmark::DoNotOptimize(
          scorer(image.row(y), image.width, 3, image.width - 3, 9, threshold, scores.data()));
    }
  }
  finish(state, image);
}

BENCHMARK(scoreRows<image_processing::fastScoreRowScalar>)->DenseRange(detail, photo);
BENCHMARK(scoreRows<image_processing::fastScoreRow>)->DenseRange(detail, photo);
BENCHMARK(detect<fast9_detect>)->DenseRange(detail, photo);
BENCHMARK(detect<fast9_detect_nonmax>)->DenseRange(detail, photo);
BENCHMARK(detect<fast12_detect_nonmax>)->DenseRange(detail, photo);

}  // namespace
}  // namespace pelorin::bench
