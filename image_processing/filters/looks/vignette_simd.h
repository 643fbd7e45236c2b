// Where the pixels of a row lie in the mask of a vignette, for kernel files: included after
// <hwy/foreach_target.h> and <hwy/highway.h>, once for each instruction set.
#if defined(PELORIN_FILTERS_VIGNETTE_SIMD_H_) == defined(HWY_TARGET_TOGGLE)
#ifdef PELORIN_FILTERS_VIGNETTE_SIMD_H_
#undef PELORIN_FILTERS_VIGNETTE_SIMD_H_
#else
#define PELORIN_FILTERS_VIGNETTE_SIMD_H_
#endif

#include <hwy/highway.h>

#include "image_processing/core/simd.h"
#include "image_processing/filters/looks/vignette_rows.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace simd {

/// Indices of the mask samples that a vector of pixels takes, from the squares of their horizontal
/// coordinates on. The mask's domain is [0, 1], so its index is truncated from here.
template <class Floats>
HWY_INLINE auto maskSamples(Floats d, const VignetteRow& row, const float* uSquares) {
  const auto square = hn::Add(hn::LoadU(d, uSquares), hn::Set(d, row.vSquare));
  const auto last = hn::Set(d, row.lastSample);
  return truncate(hn::Min(hn::Mul(square, last), last));
}

}  // namespace simd
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();
#endif  // per-target include guard
