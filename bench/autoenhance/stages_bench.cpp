// One benchmark a stage of auto-enhance, on 12 megapixels, beside a plain copy of the picture.
#include <benchmark/benchmark.h>

#include <cstring>

#include "bench/support/per_pixel.h"
#include "bench/support/side_by_side.h"
#include "image_processing/autoenhance/colour/companding_steps.h"
#include "image_processing/autoenhance/colour/lab.h"
#include "image_processing/autoenhance/enhance_row.h"
#include "image_processing/autoenhance/lightness/build_tone_curve.h"
#include "image_processing/autoenhance/lightness/image_statistics.h"
#include "image_processing/autoenhance/lightness/lightness_histogram.h"
#include "image_processing/autoenhance/lightness/lightness_rows.h"
#include "image_processing/autoenhance/masks/bilateral_grid.h"
#include "image_processing/autoenhance/masks/flatness_mask.h"
#include "image_processing/autoenhance/masks/grid_blur.h"
#include "image_processing/autoenhance/masks/grid_splat.h"
#include "image_processing/autoenhance/masks/image_masks.h"

namespace pelorin::bench {
namespace {

using namespace image_processing;
using Quantized = QuantizedFloat<unsigned char>;

Image<float> lightnessByDefinition(const Image<RGBA8Pixel>& photo) {
  Image<float> lightness(photo.width, photo.height);
  for (std::size_t i = 0; i < photo.pixelCount(); ++i) {
    const RGBA8Pixel& p = photo.data.get()[i];
    lightness.data.get()[i] = rgbToLab(p.r, p.g, p.b).L / 100.0f;
  }
  return lightness;
}

const Image<float>& lightness() {
  static const Image<float> plane = lightnessByDefinition(twelveMegapixels());
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

#define SIDE_BY_SIDE UseManualTime()->Iterations(turns)->Unit(benchmark::kMillisecond)

void countByDefinition(const Image<RGBA8Pixel>& photo, LightnessHistogram& histogram) {
  std::vector<std::uint16_t> steps(photo.pixelCount());
  compandingStepsScalar(photo.data.get(), steps.data(), steps.size());
  histogram.add(steps.data(), steps.size());
}

void statistics(benchmark::State& state) {
  const Image<RGBA8Pixel>& photo = twelveMegapixels();
  LightnessHistogram histogram(lightnessBins, lightnessScale);
  ImageStatistics statistics;
  sideBySide(
      state, photo, [&] { countByDefinition(photo, histogram); },
      [&] { analyzeImage(photo, {}, statistics); });
}
BENCHMARK(statistics)->SIDE_BY_SIDE;

void lightnessRows(benchmark::State& state) {
  const Image<RGBA8Pixel>& photo = twelveMegapixels();
  sideBySide(
      state, photo, [&] { benchmark::DoNotOptimize(lightnessByDefinition(photo).data.get()); },
      [&] {
        LightnessRows rows(photo);
        for (std::uint32_t y = 0; y < photo.height; ++y) benchmark::DoNotOptimize(rows.row(y));
      });
}
BENCHMARK(lightnessRows)->SIDE_BY_SIDE;

constexpr float cellSize = 75.0f;

Grid splatted() {
  Grid grid = makeGrid(lightness().width, lightness().height, cellSize);
  splat(lightness(), cellSize, grid);
  return grid;
}

void gridSplat(benchmark::State& state) {
  Grid grid = makeGrid(lightness().width, lightness().height, cellSize);
  sideBySide(
      state, lightness(), [&] { splatScalar(lightness(), cellSize, grid); },
      [&] { splat(lightness(), cellSize, grid); });
}
BENCHMARK(gridSplat)->SIDE_BY_SIDE;

void gridBlur(benchmark::State& state) {
  Grid grid = splatted();
  sideBySide(
      state, lightness(), [&] { blurScalar(grid, 0.7f); }, [&] { blur(grid, 0.7f); });
}
BENCHMARK(gridBlur)->SIDE_BY_SIDE;

template <typename T>
void gridSlice(benchmark::State& state) {
  Grid grid = splatted();
  blur(grid, 0.7f);
  Image<T> smoothed(lightness().width, lightness().height);
  smoothed.set(T());
  sideBySide(
      state, lightness(), [&] { sliceScalar(grid, lightness(), cellSize, smoothed); },
      [&] { slice(grid, lightness(), cellSize, smoothed); });
}
BENCHMARK(gridSlice<float>)->SIDE_BY_SIDE;
BENCHMARK(gridSlice<Quantized>)->SIDE_BY_SIDE;

template <typename T>
void flatnessMask(benchmark::State& state) {
  const Image<T>& smoothed = *masks<T>().bilateralMask;
  Image<T> mask(smoothed.width, smoothed.height);
  mask.set(T());
  sideBySide(
      state, lightness(), [&] { computeFlatnessMaskScalar(lightness(), smoothed, 8, mask); },
      [&] { computeFlatnessMask(lightness(), smoothed, 8, mask); });
}
BENCHMARK(flatnessMask<float>)->SIDE_BY_SIDE;
BENCHMARK(flatnessMask<Quantized>)->SIDE_BY_SIDE;

/// All of it, into masks that are there already; `init` in auto_enhance_bench makes new ones.
template <typename T>
void preparation(benchmark::State& state) {
  const Image<RGBA8Pixel>& photo = twelveMegapixels();
  Image<T> bilateral(photo.width, photo.height), ltm(photo.width, photo.height);
  bilateral.set(T());
  ltm.set(T());
  LightnessHistogram histogram(lightnessBins, lightnessScale);
  const auto byDefinition = [&] {
    countByDefinition(photo, histogram);
    const Image<float> plane = lightnessByDefinition(photo);
    Grid grid = makeGrid(photo.width, photo.height, cellSize);
    splatScalar(plane, cellSize, grid);
    blurScalar(grid, 0.7f);
    sliceScalar(grid, plane, cellSize, bilateral);
    computeFlatnessMaskScalar(plane, bilateral, 8, ltm);
  };
  const auto fast = [&] {
    LightnessCounter counter;
    computeMasksByGrid(photo, {}, defaultFilterConfigValue, bilateral, ltm, counter);
  };
  sideBySide(state, photo, byDefinition, fast);
}
BENCHMARK(preparation<float>)->SIDE_BY_SIDE;
BENCHMARK(preparation<Quantized>)->SIDE_BY_SIDE;

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
