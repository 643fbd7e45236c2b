#include "image_processing/autoenhance/masks/skin.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/autoenhance/masks/skin_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include "image_processing/autoenhance/colour/colour_tables.h"
#include "image_processing/autoenhance/colour/lab_simd.h"
#include "image_processing/core/simd.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
namespace hn = hwy::HWY_NAMESPACE;
using lab::F;
using lab::Floats;
using lab::set;

/// A table in vectors, for ordinary numbers.
class Table {
 public:
  explicit Table(const MonotonicTable<float>& table)
      : samples_(table.samples().data()),
        lo_(table.lo()),
        scale_(table.scale()),
        last_(static_cast<float>(table.samples().size() - 1)) {}

  HWY_INLINE F operator()(F x) const {
    const F place = hn::Mul(hn::Sub(x, set(lo_)), set(scale_));
    const F held = simd::clampTo(place, hn::Zero(Floats()), set(last_));
    return hn::GatherIndex(Floats(), samples_, simd::truncate(held));
  }

 private:
  const float* samples_;
  float lo_, scale_, last_;
};

void findSkin(const RGBA8Pixel* pixels, float* skin, std::size_t count) {
  const ColourTables& tables = colourTables();
  const float* const xyzToLab = tables.xyzToLab.samples().data();
  const Table skinA(tables.skinA), skinB(tables.skinB);
  constexpr std::size_t lanes = hn::MaxLanes(Floats());
  std::size_t i = 0;
  for (; i + lanes <= count; i += lanes) {
    const lab::Steps steps = lab::stepsOf(pixels + i);
    const F fx = hn::GatherIndex(Floats(), xyzToLab, steps.x);
    const F fy = hn::GatherIndex(Floats(), xyzToLab, steps.y);
    const F fz = hn::GatherIndex(Floats(), xyzToLab, steps.z);
    const F a = hn::Mul(set(labAGain), hn::Sub(fx, fy));
    const F b = hn::Mul(set(labBGain), hn::Sub(fy, fz));
    hn::StoreU(hn::Mul(skinA(a), skinB(b)), Floats(), skin + i);
  }
  findSkinScalar(pixels + i, skin + i, count - i);
}

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
namespace pelorin::image_processing {

HWY_EXPORT(findSkin);

void findSkin(const RGBA8Pixel* pixels, float* skin, std::size_t count) {
  HWY_DYNAMIC_DISPATCH(findSkin)(pixels, skin, count);
}

}  // namespace pelorin::image_processing
#endif
