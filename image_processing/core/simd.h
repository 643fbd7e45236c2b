// Our own idioms over Highway, for kernel files: included after <hwy/foreach_target.h> and
// <hwy/highway.h>, once for each instruction set.
#if defined(PELORIN_CORE_SIMD_H_) == defined(HWY_TARGET_TOGGLE)
#ifdef PELORIN_CORE_SIMD_H_
#undef PELORIN_CORE_SIMD_H_
#else
#define PELORIN_CORE_SIMD_H_
#endif

#include <hwy/highway.h>

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace simd {
namespace hn = hwy::HWY_NAMESPACE;

/// a / b rounded as IEEE asks. Vectors of 32-bit ARM divide approximately: there, lane by lane.
template <class V>
HWY_INLINE V divide(V a, V b) {
#if HWY_ARCH_ARM_V7
  const hn::DFromV<V> d;
  HWY_ALIGN float top[hn::MaxLanes(d)], bottom[hn::MaxLanes(d)];
  hn::Store(a, d, top);
  hn::Store(b, d, bottom);
  for (size_t i = 0; i < hn::Lanes(d); ++i) top[i] /= bottom[i];
  return hn::Load(d, top);
#else
  return hn::Div(a, b);
#endif
}

/// The larger and smaller of ordinary numbers held to [low, high].
template <class V>
HWY_INLINE V clampTo(V value, V low, V high) {
  return hn::Min(hn::Max(value, low), high);
}

}  // namespace simd
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();
#endif  // per-target include guard
