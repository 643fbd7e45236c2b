// Green histograms of 12 megapixels: photo-like, of one colour (every pixel meets the counter just
// written), noise (no two neighbours alike).
#include <benchmark/benchmark.h>

#include "bench/support/per_pixel.h"
#include "bench/support/side_by_side.h"
#include "image_processing/dupe/green_cdf.h"
#include "tests/support/pictures.h"

namespace pelorin::bench {
namespace {

using namespace image_processing;

void greenCdf(benchmark::State& state, const Image<RGBA8Pixel>& image) {
  GreenCDF cdf;
  sideBySide(
      state, image,
      [&] {
        computeGreenCDFScalar(image, cdf);
        benchmark::DoNotOptimize(cdf);
      },
      [&] {
        computeGreenCDF(image, cdf);
        benchmark::DoNotOptimize(cdf);
      });
}

void greenCdfOfPhoto(benchmark::State& state) {
  greenCdf(state, twelveMegapixels());
}
void greenCdfOfOneColour(benchmark::State& state) {
  greenCdf(state, test_support::flatPicture(4000, 3000, {10, 120, 30, 255}));
}
void greenCdfOfNoise(benchmark::State& state) {
  greenCdf(state, test_support::noisePicture(4000, 3000, 1));
}

BENCHMARK(greenCdfOfPhoto)->UseManualTime()->Iterations(turns)->Unit(benchmark::kMillisecond);
BENCHMARK(greenCdfOfOneColour)->UseManualTime()->Iterations(turns)->Unit(benchmark::kMillisecond);
BENCHMARK(greenCdfOfNoise)->UseManualTime()->Iterations(turns)->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace pelorin::bench
