// `lab.h` in vectors: included after <hwy/foreach_target.h> and <hwy/highway.h>, once for each
// instruction set.
#if defined(PELORIN_AUTOENHANCE_LAB_SIMD_H_) == defined(HWY_TARGET_TOGGLE)
#ifdef PELORIN_AUTOENHANCE_LAB_SIMD_H_
#undef PELORIN_AUTOENHANCE_LAB_SIMD_H_
#else
#define PELORIN_AUTOENHANCE_LAB_SIMD_H_
#endif

#include <hwy/highway.h>

#include "image_processing/autoenhance/colour/lab_constants.h"
#include "image_processing/autoenhance/colour/srgb.h"
#include "image_processing/core/pixel_types.h"
#include "image_processing/core/simd.h"
#include "image_processing/core/truncate_small.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace lab {
namespace hn = hwy::HWY_NAMESPACE;
using Floats = hn::CappedTag<float, 16>;
using F = hn::Vec<Floats>;
using I = hn::Vec<hn::RebindToSigned<Floats>>;
constexpr float lastInverseSample = inverseCompandingSamples - 1;

HWY_INLINE F set(float value) {
  return hn::Set(Floats(), value);
}

/// A row of a colour matrix times a colour.
HWY_INLINE F product(const MatrixRow& row, F x, F y, F z) {
  F sum = hn::Mul(set(row.first), x);
  sum = hn::Add(sum, hn::Mul(set(row.second), y));
  return hn::Add(sum, hn::Mul(set(row.third), z));
}

/// Where the companding table is read for X, Y and Z.
struct Steps {
  I x, y, z;
};

/// Those of a vector of pixels.
HWY_INLINE Steps stepsOf(const RGBA8Pixel* at) {
  using Words = hn::RebindToUnsigned<Floats>;
  using Ints = hn::RebindToSigned<Floats>;
  // Red in the low byte: every target is little-endian.
  const auto pixels = hn::LoadU(Words(), reinterpret_cast<const std::uint32_t*>(at));
  const auto channel = [](auto word) HWY_ATTR {
    const auto code = hn::BitCast(Ints(), hn::And(word, hn::Set(Words(), 0xFFu)));
    return hn::GatherIndex(Floats(), sRGBToLinearTable.data(), code);
  };
  const F r = channel(pixels);
  const F g = channel(hn::ShiftRight<8>(pixels));
  const F b = channel(hn::ShiftRight<16>(pixels));
  // No colour goes beyond white, which takes the last step.
  const auto step = [](F value) HWY_ATTR {
    return simd::truncateSmall(hn::Mul(value, set(compandingSamples - 1)));
  };
  return {step(product(xOfRgb, r, g, b)), step(product(yOfRgb, r, g, b)),
          step(product(zOfRgb, r, g, b))};
}

HWY_INLINE F lightness(F fy) {
  return hn::Sub(hn::Mul(set(labLGain), fy), set(labLOffset));
}

/// Index of the sample that a look-up of `x` takes in an inverse table of `scale` samples per unit.
HWY_INLINE F sampleIndex(F x, float scale) {
  const F place = simd::clampTo(hn::Mul(x, set(scale)), hn::Zero(Floats()), set(lastInverseSample));
  return simd::wholePart(place);
}

/// `Lab2xzTable` at `x`: its samples are the formula at their own arguments, which takes less time
/// than to fetch them.
HWY_INLINE F labToXz(F x) {
  const F sample = hn::Mul(sampleIndex(x, lastInverseSample), set(1.0f / lastInverseSample));
  const F cube = hn::Mul(hn::Mul(sample, sample), sample);
  const F line = simd::divide(hn::Sub(hn::Mul(set(labLGain), sample), set(labLOffset)),
                              simd::Divisor(cieKappa));
  return hn::IfThenElse(hn::Gt(cube, set(cieEpsilon)), cube, line);
}

/// `Lab2yTable` likewise.
HWY_INLINE F labToY(F L) {
  constexpr float scale = lastInverseSample / labWhite;
  const F sample = hn::Mul(sampleIndex(L, scale), set(1.0f / scale));
  const F fy = simd::divide(hn::Add(sample, set(labLOffset)), simd::Divisor(labLGain));
  const F cube = hn::Mul(hn::Mul(fy, fy), fy);
  const F line = simd::divide(sample, simd::Divisor(cieKappa));
  return hn::IfThenElse(hn::Gt(sample, set(cieKappaEpsilon)), cube, line);
}

}  // namespace lab
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();
#endif  // per-target include guard
