#pragma once

#include <benchmark/benchmark.h>

#include <cstdint>

#include "image_processing/core/image.h"

namespace pelorin::bench {

/// The picture most benchmarks work on: photo-like, 4000 x 3000. Made once, then shared; read-only.
const image_processing::Image<image_processing::RGBA8Pixel>& twelveMegapixels();

/// Reports the time a pixel takes as `per_px`, the figure every stage is compared by.
void reportPerPixel(benchmark::State& state, std::uint64_t pixels);

}  // namespace pelorin::bench
