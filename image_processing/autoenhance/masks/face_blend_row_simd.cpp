#include "image_processing/autoenhance/masks/face_blend_row.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/autoenhance/masks/face_blend_row_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include <tuple>

#include "image_processing/core/pixel_types.h"
#include "image_processing/core/simd.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
using Quantized = QuantizedFloat<unsigned char>;
#if HWY_ARCH_ARM_V7  // whose vectors have no denormals
template <typename T>
void blendFaceRow(const float* columns, float row, const float* skin, std::uint64_t times, T* mask,
                  std::size_t count) {
  blendFaceRowScalar(columns, row, skin, times, mask, count);
}
#else
namespace hn = hwy::HWY_NAMESPACE;
using Floats = hn::CappedTag<float, 16>;
using Ints = hn::RebindToSigned<Floats>;
using F = hn::Vec<Floats>;
using I = hn::Vec<Ints>;
constexpr std::size_t lanes = hn::MaxLanes(Floats());

HWY_INLINE F set(float value) {
  return hn::Set(Floats(), value);
}

/// A vector of a mask. Its constructors are written out, since GCC compiles others for the least of the
/// instruction sets.
template <typename T>
struct Values;

template <>
struct Values<float> {
  F value;

  HWY_INLINE Values() {}
  HWY_INLINE void load(const float* mask) { value = hn::LoadU(Floats(), mask); }
  HWY_INLINE void assign(F next) { value = next; }
  HWY_INLINE void store(float* mask) const { hn::StoreU(value, Floats(), mask); }
};

template <>
struct Values<Quantized> {
  using Bytes = hn::Rebind<std::uint8_t, Floats>;

  F value;
  I code;

  HWY_INLINE Values() {}
  HWY_INLINE void load(const Quantized* mask) {
    setCode(hn::PromoteTo(Ints(), hn::LoadU(Bytes(), reinterpret_cast<const std::uint8_t*>(mask))));
  }
  HWY_INLINE void assign(F next) {
    setCode(simd::truncate(hn::Mul(next, set(Quantized::codesPerUnit))));
  }
  HWY_INLINE void store(Quantized* mask) const {
    hn::StoreU(hn::DemoteTo(Bytes(), code), Bytes(), reinterpret_cast<std::uint8_t*>(mask));
  }

 private:
  HWY_INLINE void setCode(I next) {
    code = next;
    value = simd::divide(hn::ConvertTo(Floats(), code), simd::Divisor(Quantized::codesPerUnit));
  }
};

/// Some vectors at once, since each waits for what it was the time before.
template <std::size_t vectors, typename T>
HWY_INLINE void blend(const float* columns, float row, const float* skin, std::uint64_t times,
                      T* mask) {
  F share[vectors], kept[vectors];
  Values<T> values[vectors];
  for (std::size_t v = 0; v < vectors; ++v) {
    const F weight = hn::Mul(hn::Mul(hn::LoadU(Floats(), columns + v * lanes), set(row)),
                             hn::LoadU(Floats(), skin + v * lanes));
    share[v] = hn::Mul(set(0.5f), weight);
    kept[v] = hn::Sub(set(1.0f), weight);
    values[v].load(mask + v * lanes);
  }
  for (std::uint64_t time = 0; time < times; ++time) {
    auto same = hn::Eq(set(0.0f), set(0.0f));
    for (std::size_t v = 0; v < vectors; ++v) {
      const F before = values[v].value;
      values[v].assign(hn::Add(share[v], hn::Mul(kept[v], before)));
      same = hn::And(same, hn::Eq(values[v].value, before));
    }
    if (hn::AllTrue(Floats(), same)) break;
  }
  for (std::size_t v = 0; v < vectors; ++v) values[v].store(mask + v * lanes);
}

template <typename T>
void blendFaceRow(const float* columns, float row, const float* skin, std::uint64_t times, T* mask,
                  std::size_t count) {
  constexpr std::size_t vectors = 4;
  std::size_t i = 0;
  for (; i + vectors * lanes <= count; i += vectors * lanes)
    blend<vectors>(columns + i, row, skin + i, times, mask + i);
  for (; i + lanes <= count; i += lanes) blend<1>(columns + i, row, skin + i, times, mask + i);
  blendFaceRowScalar(columns + i, row, skin + i, times, mask + i, count - i);
}
#endif

/// For every kind of mask.
using Entries = std::tuple<decltype(&blendFaceRow<float>), decltype(&blendFaceRow<Quantized>)>;
Entries entries() {
  return {blendFaceRow<float>, blendFaceRow<Quantized>};
}

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
namespace pelorin::image_processing {

HWY_EXPORT(entries);

template <typename T>
void blendFaceRow(const float* columns, float row, const float* skin, std::uint64_t times, T* mask,
                  std::size_t count) {
  std::get<decltype(&HWY_NAMESPACE::blendFaceRow<T>)>(HWY_DYNAMIC_DISPATCH(entries)())(
      columns, row, skin, times, mask, count);
}

template void blendFaceRow(const float*, float, const float*, std::uint64_t, float*, std::size_t);
template void blendFaceRow(const float*, float, const float*, std::uint64_t,
                           QuantizedFloat<unsigned char>*, std::size_t);

}  // namespace pelorin::image_processing
#endif
