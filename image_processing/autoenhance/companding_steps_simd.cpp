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
using Words = hn::RebindToUnsigned<Floats>;
constexpr std::size_t lanes = hn::MaxLanes(Floats());

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
  const hn::Rebind<std::uint16_t, Floats> halves;
  const auto byte = hn::Set(Words(), 0xFFu);
  const auto most = hn::Set(Floats(), 9999.0f);
  std::size_t i = 0;
  for (; i + lanes <= count; i += lanes) {
    // Red in the low byte: every target is little-endian.
    const auto p = hn::LoadU(Words(), reinterpret_cast<const std::uint32_t*>(pixels + i));
    const auto share = [&](const float* table, auto word) HWY_ATTR {
      return hn::GatherIndex(Floats(), table, hn::BitCast(Ints(), hn::And(word, byte)));
    };
    auto luminance = hn::Add(share(shares.red, p), share(shares.green, hn::ShiftRight<8>(p)));
    luminance = hn::Add(luminance, share(shares.blue, hn::ShiftRight<16>(p)));
    const auto step = hn::ConvertTo(Ints(), hn::Min(hn::Mul(luminance, most), most));
    hn::StoreU(hn::DemoteTo(halves, step), halves, steps + i);
  }
  compandingStepsScalar(pixels + i, steps + i, count - i);
}

void unitLightness(const std::uint16_t* steps, float* lightness, std::size_t count) {
  const float* const ofSteps = unitLightnessOfSteps().data();
  const hn::Rebind<std::uint16_t, Floats> halves;
  std::size_t i = 0;
  for (; i + lanes <= count; i += lanes) {
    const auto step = hn::PromoteTo(Ints(), hn::LoadU(halves, steps + i));
    hn::StoreU(hn::GatherIndex(Floats(), ofSteps, step), Floats(), lightness + i);
  }
  for (; i < count; ++i) lightness[i] = ofSteps[steps[i]];
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

HWY_EXPORT(unitLightness);
void unitLightness(const std::uint16_t* steps, float* lightness, std::size_t count) {
  HWY_DYNAMIC_DISPATCH(unitLightness)(steps, lightness, count);
}
}  // namespace pelorin::image_processing
#endif
