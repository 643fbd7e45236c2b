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

/// A constant to divide by. Its inverse is held in two floats: their sum is the inverse to some 48
/// bits.
struct Divisor {
  explicit constexpr Divisor(float divisor)
      : value(divisor),
        inverse(1.0f / divisor),
        rest(static_cast<float>(1.0 / static_cast<double>(divisor) -
                                static_cast<double>(1.0f / divisor))) {}
  float value, inverse, rest;
};

/// a / b rounded as IEEE asks, for a of 0 or from 2^-60 to 2^60 in size. Where vectors have a true
/// fused multiply-add two operations do; that they round as the division would is a property of
/// each divisor, proven for every one in use by DivideByAConstant.IsTheDivisionForEveryMantissa.
template <class V>
HWY_INLINE V divide(V a, const Divisor& b) {
  const hn::DFromV<V> d;
#if HWY_NATIVE_FMA
  return hn::MulAdd(a, hn::Set(d, b.inverse), hn::Mul(a, hn::Set(d, b.rest)));
#else
  return divide(a, hn::Set(d, b.value));
#endif
}

/// The square root rounded as IEEE asks; lane by lane where `divide` goes so.
template <class V>
HWY_INLINE V squareRoot(V a) {
#if HWY_ARCH_ARM_V7
  const hn::DFromV<V> d;
  HWY_ALIGN float lanes[hn::MaxLanes(d)];
  hn::Store(a, d, lanes);
  for (size_t i = 0; i < hn::Lanes(d); ++i) lanes[i] = __builtin_sqrtf(lanes[i]);
  return hn::Load(d, lanes);
#else
  return hn::Sqrt(a);
#endif
}

/// Toward zero, for floats that an `std::int32_t` can hold: `hn::ConvertTo` without the three
/// instructions that saturate the others.
template <class V, class D = hn::RebindToSigned<hn::DFromV<V>>>
HWY_INLINE hn::Vec<D> truncate(V a) {
#if HWY_TARGET <= HWY_AVX3
  if constexpr (sizeof(a) == 64) return hn::Vec<D>{_mm512_cvttps_epi32(a.raw)};
#endif
#if HWY_TARGET <= HWY_AVX2
  if constexpr (sizeof(a) == 32) return hn::Vec<D>{_mm256_cvttps_epi32(a.raw)};
#endif
#if HWY_TARGET <= HWY_SSSE3
  if constexpr (sizeof(a) == 16) return hn::Vec<D>{_mm_cvttps_epi32(a.raw)};
#endif
  return hn::ConvertTo(D(), a);
}

/// The larger and smaller of ordinary numbers held to [low, high].
template <class V>
HWY_INLINE V clampTo(V value, V low, V high) {
  return hn::Min(hn::Max(value, low), high);
}

#if HWY_TARGET != HWY_SCALAR  // where a vector has a single lane
/// A vector of floats from groups of four: group g is read at `at(g)`.
template <class D, class At>
HWY_INLINE hn::Vec<D> loadFours(D d, At at) {
  if constexpr (hn::MaxLanes(D()) <= 4) {
    return hn::LoadU(d, at(0));
  } else {
    const hn::Half<D> half;
    constexpr std::size_t groups = hn::MaxLanes(half) / 4;
    return hn::Combine(d, loadFours(half, [&](std::size_t g) HWY_ATTR { return at(groups + g); }),
                       loadFours(half, at));
  }
}

/// Stores group g of four floats at `at(g)`.
template <class D, class At>
HWY_INLINE void storeFours(D d, hn::Vec<D> v, At at) {
  if constexpr (hn::MaxLanes(D()) <= 4) {
    hn::StoreU(v, d, at(0));
  } else {
    const hn::Half<D> half;
    constexpr std::size_t groups = hn::MaxLanes(half) / 4;
    storeFours(half, hn::LowerHalf(half, v), at);
    storeFours(half, hn::UpperHalf(half, v),
               [&](std::size_t g) HWY_ATTR { return at(groups + g); });
  }
}

/// Transposes four vectors in place: afterwards lane 4 g + i of vector j is what lane 4 g + j of
/// vector i was.
template <class D>
HWY_INLINE void transposeFours(D d, hn::Vec<D>* rows) {
  const auto evenLow = hn::InterleaveLower(d, rows[0], rows[2]);
  const auto oddLow = hn::InterleaveLower(d, rows[1], rows[3]);
  const auto evenHigh = hn::InterleaveUpper(d, rows[0], rows[2]);
  const auto oddHigh = hn::InterleaveUpper(d, rows[1], rows[3]);
  rows[0] = hn::InterleaveLower(d, evenLow, oddLow);
  rows[1] = hn::InterleaveUpper(d, evenLow, oddLow);
  rows[2] = hn::InterleaveLower(d, evenHigh, oddHigh);
  rows[3] = hn::InterleaveUpper(d, evenHigh, oddHigh);
}
#endif

}  // namespace simd
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();
#endif  // per-target include guard
