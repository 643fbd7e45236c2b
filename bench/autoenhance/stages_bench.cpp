// One benchmark a stage of auto-enhance, on 12 megapixels, beside a plain copy of the picture.
#include <benchmark/benchmark.h>

#include <cstring>

#include "bench/support/per_pixel.h"
#include "bench/support/side_by_side.h"
#include "image_processing/autoenhance/bilateral_grid.h"
#include "image_processing/autoenhance/build_tone_curve.h"
#include "image_processing/autoenhance/enhance_row.h"
#include "image_processing/autoenhance/flatness_mask.h"
#include "image_processing/autoenhance/image_masks.h"
#include "image_processing/autoenhance/image_statistics.h"
#include "image_processing/autoenhance/lab.h"

namespace pelorin::bench {
namespace {

using namespace image_processing;
using Quantized = QuantizedFloat<unsigned char>;

const Image<float>& lightness() {
  static const Image<float> plane = [] {
    const Image<RGBA8Pixel>& photo = twelveMegapixels();
    Image<float> lightness(photo.width, photo.height);
    for (std::size_t i = 0; i < photo.pixelCount(); ++i) {
      const RGBA8Pixel& p = photo.data.get()[i];
      lightness.data.get()[i] = lightnessOf(colourTables(), p.r, p.g, p.b) / 100.0f;
    }
    return lightness;
  }();
  return plane;
}

template <typename T>
const ImageMasks<T, T>& masks() {
  static const ImageMasks<T, T> made = [] {
    ImageMasks<T, T> masks;
    computeImageMasks(twelveMegapixels(), {}, defaultFilterConfigValue, masks);
    return masks;
  }();
  return made;
}

void copyOfThePicture(benchmark::State& state) {
  const Image<RGBA8Pixel>& photo = twelveMegapixels();
  Image<RGBA8Pixel> copy(photo.width, photo.height);
  for (auto _ : state) {
    std::memcpy(copy.data.get(), photo.data.get(), photo.byteSize());
    benchmark::ClobberMemory();
  }
  reportPerPixel(state, photo.pixelCount());
}
BENCHMARK(copyOfThePicture)->Unit(benchmark::kMillisecond);

void statistics(benchmark::State& state) {
  for (auto _ : state) {
    ImageStatistics statistics;
    analyzeImage(twelveMegapixels(), {}, statistics);
    benchmark::DoNotOptimize(statistics.cdf.data());
  }
  reportPerPixel(state, twelveMegapixels().pixelCount());
}
BENCHMARK(statistics)->Unit(benchmark::kMillisecond);

template <typename T>
void bilateralGrid(benchmark::State& state) {
  const Image<float>& plane = lightness();
  Image<T> smoothed(plane.width, plane.height);
  for (auto _ : state) bilateralFilterGridApproximation(plane, 0.7f, 75.0f, smoothed);
  reportPerPixel(state, plane.pixelCount());
}
BENCHMARK(bilateralGrid<float>)->Unit(benchmark::kMillisecond);
BENCHMARK(bilateralGrid<Quantized>)->Unit(benchmark::kMillisecond);

template <typename T>
void flatnessMask(benchmark::State& state) {
  const Image<float>& plane = lightness();
  Image<T> mask(plane.width, plane.height);
  for (auto _ : state) computeFlatnessMask(plane, *masks<T>().bilateralMask, 8, mask);
  reportPerPixel(state, plane.pixelCount());
}
BENCHMARK(flatnessMask<float>)->Unit(benchmark::kMillisecond);
BENCHMARK(flatnessMask<Quantized>)->Unit(benchmark::kMillisecond);

/// The pass over the pixels as one slider position asks for it.
template <typename T, bool withMasks>
void pixelPass(benchmark::State& state) {
  const Image<RGBA8Pixel>& photo = twelveMegapixels();
  ImageStatistics statistics;
  analyzeImage(photo, {}, statistics);
  FilterConfig config = defaultFilterConfigValue;
  updateFilterConfigForSliderValue(0.4f, &config);
  const TonePass pass(buildToneCurve(statistics, config), 100.0f, config.vibrance, config.ltmBlend,
                      config.detailGain);
  const T* const bilateral = withMasks ? masks<T>().bilateralMask->data.get() : nullptr;
  const T* const ltm = withMasks ? masks<T>().ltmMask->data.get() : nullptr;
  Image<RGBA8Pixel> output(photo.width, photo.height);
  output.set({0, 0, 0, 0});
  const auto run = [&](auto enhance) {
    return [&, enhance] {
      enhance(pass, photo.data.get(), bilateral, ltm, output.data.get(), photo.pixelCount());
    };
  };
  sideBySide(state, photo, run(enhanceRowScalar<T>), run(enhanceRow<T>));
}
BENCHMARK(pixelPass<float, true>)->UseManualTime()->Iterations(turns);
BENCHMARK(pixelPass<Quantized, true>)->UseManualTime()->Iterations(turns);
BENCHMARK(pixelPass<float, false>)->UseManualTime()->Iterations(turns);

}  // namespace
}  // namespace pelorin::bench
