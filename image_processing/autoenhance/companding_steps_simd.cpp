#include "image_processing/autoenhance/companding_steps.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/autoenhance/companding_steps_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include "image_processing/autoenhance/colour_tables.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
namespace hn = hwy::HWY_NAMESPACE;
using Floats = hn::CappedTag<float, 16>;
using Ints = hn::RebindToSigned<Floats>;

/// Linear light times its share of Y, by code: the product of a table entry and a constant is the
/// same float whenever it is formed.
struct Shares {
  float red[256], green[256], blue[256];

  Shares() {
    const auto& linear = colourTables().linear;
    for (int code = 0; code < 256; ++code) {
      red[code] = 0.2126729f * linear[code];
      green[code] = 0.7151522f * linear[code];
      blue[code] = 0.072175f * linear[code];
    }
  }
};

void compandingSteps(const RGBA8Pixel* pixels, std::uint16_t* steps, std::size_t count) {
  static const Shares shares;
  constexpr std::size_t lanes = hn::MaxLanes(Floats());
  const hn::Rebind<std::uint16_t, Floats> halves;
  const auto most = hn::Set(Floats(), 9999.0f);
  HWY_ALIGN float luminance[lanes];
  std::size_t i = 0;
  for (; i + lanes <= count; i += lanes) {
    // Plain loads from small tables; gathers were not compared on this loop.
    for (std::size_t lane = 0; lane < lanes; ++lane) {
      const RGBA8Pixel p = pixels[i + lane];
      luminance[lane] = shares.red[p.r] + shares.green[p.g] + shares.blue[p.b];
    }
    const auto place = hn::Mul(hn::Load(Floats(), luminance), most);
    const auto step = hn::ConvertTo(Ints(), hn::Min(place, most));
    hn::StoreU(hn::DemoteTo(halves, step), halves, steps + i);
  }
  compandingStepsScalar(pixels + i, steps + i, count - i);
}

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
namespace pelorin::image_processing {
HWY_EXPORT(compandingSteps);
void compandingSteps(const RGBA8Pixel* pixels, std::uint16_t* steps, std::size_t count) {
  HWY_DYNAMIC_DISPATCH(compandingSteps)(pixels, steps, count);
}
}  // namespace pelorin::image_processing
#endif
