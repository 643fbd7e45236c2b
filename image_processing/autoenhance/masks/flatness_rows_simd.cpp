#include "image_processing/autoenhance/masks/flatness_rows.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/autoenhance/masks/flatness_rows_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include <tuple>

#include "image_processing/core/simd.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
namespace hn = hwy::HWY_NAMESPACE;
using Floats = hn::CappedTag<float, 16>;
using Ints = hn::RebindToSigned<Floats>;
using F = hn::Vec<Floats>;
using Quantized = QuantizedFloat<unsigned char>;
constexpr std::size_t lanes = hn::MaxLanes(Floats());

HWY_INLINE F set(float value) {
  return hn::Set(Floats(), value);
}

HWY_INLINE F loadMask(const float* mask) {
  return hn::LoadU(Floats(), mask);
}
HWY_INLINE F loadMask(const QuantizedFloat<unsigned char>* mask) {
  const hn::Rebind<std::uint8_t, Floats> bytes;
  const auto stored = hn::LoadU(bytes, reinterpret_cast<const std::uint8_t*>(mask));
  return simd::divide(hn::ConvertTo(Floats(), hn::PromoteTo(Ints(), stored)),
                      simd::Divisor(QuantizedFloat<unsigned char>::codesPerUnit));
}

template <typename T>
void weigh(const GaussianApproximation<float>& weight, const float* lightness, const T* smoothed,
           float* weights, std::size_t count) {
  const auto bell = weight.terms();
  std::size_t x = 0;
  for (; x + lanes <= count; x += lanes) {
    const F difference = hn::Sub(hn::LoadU(Floats(), lightness + x), loadMask(smoothed + x));
    const F t = hn::Add(set(-1.0f), hn::Mul(hn::Sub(difference, set(bell.x0)), set(bell.scale)));
    const F a = hn::Abs(t);
    F inner = hn::Add(set(bell.a2), hn::Mul(a, set(bell.a3)));
    inner = hn::Add(set(bell.a0), hn::Mul(a, hn::Mul(a, inner)));
    F outer = hn::Add(set(bell.b2), hn::Mul(a, set(bell.b3)));
    outer = hn::Add(set(bell.b1), hn::Mul(a, outer));
    outer = hn::Add(set(bell.b0), hn::Mul(a, outer));
    const F g = hn::IfThenElse(hn::Lt(a, set(0.5f)), inner,
                               hn::IfThenElseZero(hn::Lt(a, set(1.0f)), outer));
    hn::StoreU(hn::Add(set(bell.baseline), hn::Mul(g, set(bell.span))), Floats(), weights + x);
  }
  weighRowScalar(weight, lightness + x, smoothed + x, weights + x, count - x);
}

HWY_INLINE void store(const FlatnessShape& shape, hn::Vec<Ints> places, float* mask) {
  hn::StoreU(hn::GatherIndex(Floats(), shape.samples.data(), places), Floats(), mask);
}
HWY_INLINE void store(const FlatnessShape& shape, hn::Vec<Ints> places,
                      QuantizedFloat<unsigned char>* mask) {
  const hn::Rebind<std::uint8_t, Floats> bytes;
  hn::StoreU(hn::DemoteTo(bytes, hn::GatherIndex(Ints(), shape.codes.data(), places)), bytes,
             reinterpret_cast<std::uint8_t*>(mask));
}

template <typename T>
void shapeWindows(const float* top, const float* bottom, std::ptrdiff_t n,
                  const FlatnessShape& shape, T* mask, std::size_t count) {
  const F last = set(static_cast<float>(shape.samples.size() - 1));
  std::size_t x = 0;
  for (; x + lanes <= count; x += lanes) {
    const auto at = [&](const float* row) HWY_ATTR { return hn::LoadU(Floats(), row + x); };
    const F share = hn::Sub(hn::Sub(hn::Add(at(top), at(bottom + n)), at(bottom)), at(top + n));
    const F place = simd::clampTo(hn::Mul(share, last), hn::Zero(Floats()), last);
    store(shape, simd::truncate(place), mask + x);
  }
  shapeRowScalar(top + x, bottom + x, n, shape, mask + x, count - x);
}

/// Every kernel of this file for every kind of mask. The types are those of every instruction set.
using Entries = std::tuple<decltype(&weighRow<float>), decltype(&weighRow<Quantized>),
                           decltype(&shapeRow<float>), decltype(&shapeRow<Quantized>)>;
Entries entries() {
  return {weigh<float>, weigh<Quantized>, shapeWindows<float>, shapeWindows<Quantized>};
}

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
namespace pelorin::image_processing {

HWY_EXPORT(entries);

template <typename T>
void weighRow(const GaussianApproximation<float>& weight, const float* lightness, const T* smoothed,
              float* weights, std::size_t count) {
  std::get<decltype(&weighRow<T>)>(HWY_DYNAMIC_DISPATCH(entries)())(weight, lightness, smoothed,
                                                                    weights, count);
}

template <typename T>
void shapeRow(const float* top, const float* bottom, std::ptrdiff_t n, const FlatnessShape& shape,
              T* mask, std::size_t count) {
  std::get<decltype(&shapeRow<T>)>(HWY_DYNAMIC_DISPATCH(entries)())(top, bottom, n, shape, mask,
                                                                    count);
}

using Quantized = QuantizedFloat<unsigned char>;
template void weighRow(const GaussianApproximation<float>&, const float*, const float*, float*,
                       std::size_t);
template void weighRow(const GaussianApproximation<float>&, const float*, const Quantized*, float*,
                       std::size_t);
template void shapeRow(const float*, const float*, std::ptrdiff_t, const FlatnessShape&, float*,
                       std::size_t);
template void shapeRow(const float*, const float*, std::ptrdiff_t, const FlatnessShape&, Quantized*,
                       std::size_t);

}  // namespace pelorin::image_processing
#endif
