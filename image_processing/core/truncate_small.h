// Included after <hwy/foreach_target.h> and <hwy/highway.h>, once for each instruction set.
#if defined(PELORIN_CORE_TRUNCATE_SMALL_H_) == defined(HWY_TARGET_TOGGLE)
#ifdef PELORIN_CORE_TRUNCATE_SMALL_H_
#undef PELORIN_CORE_TRUNCATE_SMALL_H_
#else
#define PELORIN_CORE_TRUNCATE_SMALL_H_
#endif

#include <hwy/highway.h>

#include "image_processing/core/simd.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace simd {

/// `truncate` for floats above -1 and below 2^22. WebAssembly's conversion saturates, which takes a
/// processor six instructions; added to 2^23, whole numbers are the mantissa.
template <class V, class D = hn::RebindToSigned<hn::DFromV<V>>>
HWY_INLINE hn::Vec<D> truncateSmall(V a) {
#if HWY_TARGET == HWY_WASM
  const hn::DFromV<V> floats;
  const auto mantissa = hn::BitCast(D(), hn::Add(hn::Trunc(a), hn::Set(floats, 0x1p23f)));
  return hn::And(mantissa, hn::Set(D(), 0x7FFFFF));
#else
  return truncate(a);
#endif
}

/// The same as floats.
template <class V>
HWY_INLINE V wholePart(V a) {
#if HWY_TARGET == HWY_WASM
  return hn::Trunc(a);
#else
  return hn::ConvertTo(hn::DFromV<V>(), truncate(a));
#endif
}

}  // namespace simd
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();
#endif  // per-target include guard
