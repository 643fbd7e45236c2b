// Every look on a photo-like picture of 12 megapixels: scalar definition and fast path, with and
// without its vignette.
#include <benchmark/benchmark.h>

#include <string>

#include "bench/support/per_pixel.h"
#include "image_processing/filters/apply_look.h"
#include "image_processing/filters/low_dim_rgb_curve_filter.h"
#include "image_processing/filters/preset_looks.h"
#include "tests/support/looks.h"

namespace pelorin::bench {
namespace {

using namespace image_processing;

template <typename Filter>
void benchLook(benchmark::State& state, bool vignette,
               void (*apply)(const Look&, const Image<RGBA8Pixel>&, Image<RGBA8Pixel>&)) {
  const Image<RGBA8Pixel>& photo = twelveMegapixels();
  const CubicRadialMask mask = test_support::maskOf<Filter>();
  const Look look = test_support::lookOf<Filter>(vignette ? &mask : nullptr);
  Image<RGBA8Pixel> output(photo.width, photo.height);
  for (auto _ : state) {
    apply(look, photo, output);
    benchmark::ClobberMemory();
  }
  reportPerPixel(state, photo.pixelCount());
}

template <typename Filter>
void registerLook(const std::string& name) {
  for (const bool vignette : {true, false}) {
    const std::string end = vignette ? "/vignette" : "/plain";
    benchmark::RegisterBenchmark((name + end + "/scalar").c_str(), benchLook<Filter>, vignette,
                                 applyLookScalar)
        ->Unit(benchmark::kMillisecond);
    benchmark::RegisterBenchmark((name + end + "/fast").c_str(), benchLook<Filter>, vignette,
                                 applyLook)
        ->Unit(benchmark::kMillisecond);
  }
}

[[maybe_unused]] const bool registered = [] {
  registerLook<ZebraBWFilter>("ZebraBW");
  registerLook<SummerRGBFilter>("SummerRGB");
  registerLook<SpringRGBFilter>("SpringRGB");
  registerLook<FallRGBFilter>("FallRGB");
  registerLook<VintageRGBFilter>("VintageRGB");
  registerLook<WinterRGBFilter>("WinterRGB");
  registerLook<LowDimRGBCurveFilter>("LowDimRGBCurve");
  return true;
}();

}  // namespace
}  // namespace pelorin::bench
