// The quality features of a photo and the loops they come from.
#include <benchmark/benchmark.h>

#include "bench/support/per_pixel.h"
#include "bench/support/side_by_side.h"
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

void features(benchmark::State& state) {
  const Image<RGBA8Pixel>& photo = twelveMegapixels();
  sideBySide(
      state, photo, [&] { benchmark::DoNotOptimize(niqeFeaturesScalar(photo)); },
      [&] { benchmark::DoNotOptimize(niqeFeatures(photo)); });
}

void grey(benchmark::State& state) {
  const Image<RGBA8Pixel>& photo = twelveMegapixels();
  Image<float> out(photo.width, photo.height);
  sideBySide(
      state, photo, [&] { niqeGreyScalar(photo.data.get(), out.data.get(), out.pixelCount()); },
      [&] { niqeGrey(photo.data.get(), out.data.get(), out.pixelCount()); });
}

void structure(benchmark::State& state) {
  const Image<float> in = greyPhoto();
  Image<float> out(in.width, in.height);
  sideBySide(
      state, in, [&] { computeImageStructure(in, in.width, in.height, out); },
      [&] { computeImageStructure_fast(in, in.width, in.height, out); });
}

void halve(benchmark::State& state) {
  Image<float> image = greyPhoto();
  const auto run = [&](auto* kernel) {
    std::uint32_t width = image.width, height = image.height;
    kernel(image, width, height);
  };
  sideBySide(
      state, image, [&] { run(imHalveScalar); }, [&] { run(imHalve); });
}

void blocks(benchmark::State& state) {
  const Image<float> in = structureOfPhoto();
  const std::uint32_t columns = in.width / niqeBlockSize, rows = in.height / niqeBlockSize;
  Image<float> out(columns * rows, niqeFeaturesPerScale);
  const auto run = [&](auto* kernel) {
    kernel(in, niqeFeaturesPerScale, niqeBlockSize, columns, rows, /*scale=*/0, out);
  };
  sideBySide(
      state, in, [&] { run(computeBlockFeaturesScalar); }, [&] { run(computeBlockFeatures); });
}

BENCHMARK(features)->UseManualTime()->Iterations(turns)->Unit(benchmark::kMillisecond);
BENCHMARK(grey)->UseManualTime()->Iterations(turns)->Unit(benchmark::kMillisecond);
BENCHMARK(structure)->UseManualTime()->Iterations(turns)->Unit(benchmark::kMillisecond);
BENCHMARK(halve)->UseManualTime()->Iterations(turns)->Unit(benchmark::kMillisecond);
BENCHMARK(blocks)->UseManualTime()->Iterations(turns)->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace pelorin::bench
