#include "bench/support/per_pixel.h"

#include "tests/support/pictures.h"

namespace pelorin::bench {

using image_processing::Image;
using image_processing::RGBA8Pixel;

const Image<RGBA8Pixel>& twelveMegapixels() {
  static const Image<RGBA8Pixel> picture = test_support::photoLikePicture(4000, 3000, 12);
  return picture;
}

void reportPerPixel(benchmark::State& state, std::uint64_t pixels) {
  using benchmark::Counter;
  state.counters["per_px"] =
      Counter(static_cast<double>(pixels), Counter::kIsIterationInvariantRate | Counter::kInvert);
}

}  // namespace pelorin::bench
