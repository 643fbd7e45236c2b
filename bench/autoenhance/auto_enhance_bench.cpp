// What a user waits for: preparing a photo once, then one application a slider position.
#include <benchmark/benchmark.h>

#include <string>

#include "bench/support/per_pixel.h"
#include "bench/support/side_by_side.h"
#include "image_processing/autoenhance/auto_enhance_filter.h"
#include "tests/support/filter_state.h"
#include "tests/support/pictures.h"

namespace pelorin::bench {
namespace {

using namespace image_processing;

/// Half, one, two and twelve megapixels.
const Image<RGBA8Pixel>& photoOf(std::int64_t megapixelsTimesTwo) {
  static const Image<RGBA8Pixel> half = test_support::photoLikePicture(816, 612, 1);
  static const Image<RGBA8Pixel> one = test_support::photoLikePicture(1152, 864, 1);
  static const Image<RGBA8Pixel> two = test_support::photoLikePicture(1632, 1224, 1);
  switch (megapixelsTimesTwo) {
    case 1:
      return half;
    case 2:
      return one;
    case 4:
      return two;
    default:
      return twelveMegapixels();
  }
}

/// A photo's preparation with each instruction set, the first touch of its new masks included.
template <typename Filter>
void init(benchmark::State& state) {
  const Image<RGBA8Pixel>& photo = photoOf(state.range(0));
  const auto shared = test_support::stateOf(photo);
  sideBySide(state, photo, {}, [&] {
    Filter filter(shared);
    filter.init("");
  });
}

/// One slider position, with each instruction set.
template <typename Filter, bool withMasks>
void applyConfig(benchmark::State& state) {
  const Image<RGBA8Pixel>& photo = photoOf(state.range(0));
  Filter filter(test_support::stateOf(photo));
  filter.init("");
  const std::string params = withMasks ? "slider=0.4;" : "slider=0.4;gtmOnly=true;";
  Image<RGBA8Pixel> output(photo.width, photo.height);
  output.set({0, 0, 0, 0});
  sideBySide(state, photo, {},
             [&] { filter.applyConfig(params, defaultFilterConfigValue, output); });
}

#define AT_EVERY_SIZE \
  ArgName("MPx2")->Arg(1)->Arg(2)->Arg(4)->Arg(24)->Unit(benchmark::kMillisecond)
BENCHMARK(init<AEFilter>)->AT_EVERY_SIZE->UseManualTime()->Iterations(turns);
BENCHMARK(init<AEFilter8bit>)->AT_EVERY_SIZE->UseManualTime()->Iterations(turns);
BENCHMARK(applyConfig<AEFilter, true>)->AT_EVERY_SIZE->UseManualTime()->Iterations(turns);
BENCHMARK(applyConfig<AEFilter8bit, true>)->AT_EVERY_SIZE->UseManualTime()->Iterations(turns);
BENCHMARK(applyConfig<AEFilter, false>)->AT_EVERY_SIZE->UseManualTime()->Iterations(turns);

}  // namespace
}  // namespace pelorin::bench
