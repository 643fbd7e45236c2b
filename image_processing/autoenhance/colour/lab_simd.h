// `lab.h` in vectors: included after <hwy/foreach_target.h> and <hwy/highway.h>, once for each
// instruction set.
#if defined(PELORIN_AUTOENHANCE_LAB_SIMD_H_) == defined(HWY_TARGET_TOGGLE)
#ifdef PELORIN_AUTOENHANCE_LAB_SIMD_H_
#undef PELORIN_AUTOENHANCE_LAB_SIMD_H_
#else
#define PELORIN_AUTOENHANCE_LAB_SIMD_H_
#endif

#include <hwy/highway.h>

#include "image_processing/core/simd.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace lab {
namespace hn = hwy::HWY_NAMESPACE;
using Floats = hn::CappedTag<float, 16>;
using F = hn::Vec<Floats>;

HWY_INLINE F set(float value) {
  return hn::Set(Floats(), value);
}

/// One row of a colour matrix times a colour.
HWY_INLINE F matrixRow(F x, F y, F z, float ofX, float ofY, float ofZ) {
  F sum = hn::Mul(set(ofX), x);
  sum = hn::Add(sum, hn::Mul(set(ofY), y));
  return hn::Add(sum, hn::Mul(set(ofZ), z));
}

HWY_INLINE F lightness(F fy) {
  return hn::Sub(hn::Mul(set(116.0f), fy), set(16.0f));
}

/// Index of the sample of a table over [0, 1000 / scale] that a look-up of `x` takes.
HWY_INLINE F sampleOf1000(F x, float scale) {
  const F place = simd::clampTo(hn::Mul(x, set(scale)), hn::Zero(Floats()), set(999.0f));
  return hn::ConvertTo(Floats(), simd::truncate(place));
}

/// `Lab2xzTable` at `x`: its samples are the formula at their own arguments, which takes less time
/// than to fetch them.
HWY_INLINE F labToXz(F x) {
  const F sample = hn::Mul(sampleOf1000(x, 999.0f), set(1.0f / 999.0f));
  const F cube = hn::Mul(hn::Mul(sample, sample), sample);
  const F line =
      simd::divide(hn::Sub(hn::Mul(set(116.0f), sample), set(16.0f)), simd::Divisor(903.3f));
  return hn::IfThenElse(hn::Gt(cube, set(0.008856f)), cube, line);
}

/// `Lab2yTable` likewise.
HWY_INLINE F labToY(F L) {
  constexpr float scale = 999.0f / 100.0f;
  const F sample = hn::Mul(sampleOf1000(L, scale), set(1.0f / scale));
  const F fy = simd::divide(hn::Add(sample, set(16.0f)), simd::Divisor(116.0f));
  const F cube = hn::Mul(hn::Mul(fy, fy), fy);
  const F line = simd::divide(sample, simd::Divisor(903.3f));
  return hn::IfThenElse(hn::Gt(sample, set(7.999625f)), cube, line);
}

}  // namespace lab
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();
#endif  // per-target include guard
