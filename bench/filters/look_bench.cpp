// Every look on a photo-like picture of 12 megapixels, with and without its vignette.
#include <benchmark/benchmark.h>

#include <string>

#include "bench/support/per_pixel.h"
#include "bench/support/side_by_side.h"
#include "image_processing/filters/looks/apply_look.h"
#include "image_processing/filters/looks/low_dim_rgb_curve_filter.h"
#include "image_processing/filters/looks/preset_looks.h"
#include "tests/support/looks.h"

namespace pelorin::bench {
namespace {

using namespace image_processing;

template <typename Filter>
void benchLook(benchmark::State& state, bool vignette) {
  const Image<RGBA8Pixel>& photo = twelveMegapixels();
  const CubicRadialMask mask = test_support::maskOf<Filter>();
  const Look look = test_support::lookOf<Filter>(vignette ? &mask : nullptr);
  Image<RGBA8Pixel> output(photo.width, photo.height);
  sideBySide(
      state, photo, [&] { applyLookScalar(look, photo, output); },
      [&] { applyLook(look, photo, output); });
}

template <typename Filter>
void registerLook(const std::string& name) {
  for (const bool vignette : {true, false}) {
    const std::string row = name + (vignette ? "/vignette" : "/plain");
    benchmark::RegisterBenchmark(row.c_str(), benchLook<Filter>, vignette)
        ->UseManualTime()
        ->Iterations(turns)
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
