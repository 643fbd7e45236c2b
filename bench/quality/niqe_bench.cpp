// The quality features of a photo and the loops they come from, as defined and fast.
#include <benchmark/benchmark.h>

#include "bench/support/per_pixel.h"
#include "image_processing/quality/block_features.h"
#include "image_processing/quality/im_halve.h"
#include "image_processing/quality/image_structure.h"
#include "image_processing/quality/niqe_features.h"
#include "image_processing/quality/niqe_grey.h"

namespace pelorin::bench {
namespace {

using namespace image_processing;

Image<float> greyPhoto() {
  const Image<RGBA8Pixel>& photo = twelveMegapixels();
  Image<float> grey(photo.width, photo.height);
  niqeGrey(photo.data.get(), grey.data.get(), grey.pixelCount());
  return grey;
}

Image<float> structureOfPhoto() {
  const Image<float> grey = greyPhoto();
  Image<float> structure(grey.width, grey.height);
  computeImageStructure_fast(grey, grey.width, grey.height, structure);
  return structure;
}

void features(benchmark::State& state, decltype(&niqeFeatures) kernel) {
  const Image<RGBA8Pixel>& photo = twelveMegapixels();
  for (auto _ : state) benchmark::DoNotOptimize(kernel(photo));
  reportPerPixel(state, photo.pixelCount());
}

void grey(benchmark::State& state, decltype(&niqeGrey) kernel) {
  const Image<RGBA8Pixel>& photo = twelveMegapixels();
  Image<float> out(photo.width, photo.height);
  for (auto _ : state) kernel(photo.data.get(), out.data.get(), out.pixelCount());
  reportPerPixel(state, photo.pixelCount());
}

void structure(benchmark::State& state, decltype(&computeImageStructure) kernel) {
  const Image<float> in = greyPhoto();
  Image<float> out(in.width, in.height);
  for (auto _ : state) kernel(in, in.width, in.height, out);
  reportPerPixel(state, in.pixelCount());
}

void halve(benchmark::State& state, decltype(&imHalve) kernel) {
  Image<float> image = greyPhoto();
  for (auto _ : state) {
    std::uint32_t width = image.width, height = image.height;
    kernel(image, width, height);
  }
  reportPerPixel(state, image.pixelCount());
}

void blocks(benchmark::State& state, decltype(&computeBlockFeatures) kernel) {
  const Image<float> in = structureOfPhoto();
  const std::uint32_t columns = in.width / niqeBlockSize, rows = in.height / niqeBlockSize;
  Image<float> out(columns * rows, niqeFeaturesPerScale);
  for (auto _ : state)
    kernel(in, niqeFeaturesPerScale, niqeBlockSize, columns, rows, /*scale=*/0, out);
  reportPerPixel(state, in.pixelCount());
}

BENCHMARK_CAPTURE(features, scalar, niqeFeaturesScalar)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(features, fast, niqeFeatures)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(grey, scalar, niqeGreyScalar)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(grey, fast, niqeGrey)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(structure, scalar, computeImageStructure)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(structure, fast, computeImageStructure_fast)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(halve, scalar, imHalveScalar)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(halve, fast, imHalve)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(blocks, scalar, computeBlockFeaturesScalar)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(blocks, fast, computeBlockFeatures)->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace pelorin::bench
