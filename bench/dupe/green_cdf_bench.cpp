#include <benchmark/benchmark.h>

#include "image_processing/dupe/green_cdf.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

// A 12-megapixel picture: photo-like, of one colour (every pixel meets the counter just written),
// noise (no two neighbours alike).
enum Kind { photo, flat, noise };

Image<RGBA8Pixel> picture(Kind kind) {
  constexpr std::uint32_t width = 4000, height = 3000;
  if (kind == flat) return test_support::flatPicture(width, height, {10, 120, 30, 255});
  if (kind == noise) return test_support::noisePicture(width, height, 1);
  return test_support::photoLikePicture(width, height, 1);
}

void run(benchmark::State& state, void (*compute)(const Image<RGBA8Pixel>&, GreenCDF&)) {
  const Image<RGBA8Pixel> image = picture(static_cast<Kind>(state.range(0)));
  GreenCDF cdf;
  for (auto _ : state) {
    compute(image, cdf);
    benchmark::DoNotOptimize(cdf);
  }
  state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(image.pixelCount()));
}

void greenCDFScalar(benchmark::State& state) {
  run(state, computeGreenCDFScalar);
}
void greenCDF(benchmark::State& state) {
  run(state, computeGreenCDF);
}

BENCHMARK(greenCDFScalar)->ArgName("photo_flat_noise")->DenseRange(photo, noise);
BENCHMARK(greenCDF)->ArgName("photo_flat_noise")->DenseRange(photo, noise);

}  // namespace
}  // namespace pelorin::image_processing
