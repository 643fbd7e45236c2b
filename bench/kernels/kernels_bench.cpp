// Every kernel on 12 megapixels, definition and instruction sets side by side, and on the other
// pictures its row names.
#include <benchmark/benchmark.h>

#include "bench/support/per_pixel.h"
#include "bench/support/side_by_side.h"
#include "tests/kernels/kernels.h"

namespace pelorin::bench {
namespace {

using test_support::KernelRow;
using test_support::PictureKind;

void measure(benchmark::State& state, const KernelRow& row, PictureKind kind) {
  const image_processing::Image<image_processing::RGBA8Pixel> picture =
      kind == PictureKind::photo ? twelveMegapixels() : test_support::pictureOf(kind, 4000, 3000);
  const test_support::Kernel kernel = row.on(picture);
  sideBySide(state, picture, kernel.definition, kernel.vectors);
}

void registerRow(const KernelRow& row, PictureKind kind, const std::string& name) {
  benchmark::RegisterBenchmark(name.c_str(), measure, row, kind)
      ->UseManualTime()
      ->Iterations(turns)
      ->Unit(benchmark::kMillisecond);
}

[[maybe_unused]] const bool registered = [] {
  for (const KernelRow& row : test_support::kernelRows()) {
    registerRow(row, PictureKind::photo, row.name);
    for (const PictureKind kind : row.otherPictures) {
      registerRow(row, kind, row.name + "/" + nameOf(kind));
    }
  }
  return true;
}();

}  // namespace
}  // namespace pelorin::bench
