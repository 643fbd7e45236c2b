#include "image_processing/filters/looks/direct_look.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/filters/looks/direct_look_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include <algorithm>
#include <cmath>

#include "image_processing/core/prefetch.h"
#include "image_processing/core/simd.h"
#include "image_processing/core/small_table.h"
#include "image_processing/core/truncate_small.h"
#include "image_processing/filters/looks/soft_light.h"
#include "image_processing/filters/looks/vignette_simd.h"

#if HWY_TARGET == HWY_WASM
#include "image_processing/core/entries_wasm.h"
#endif

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
namespace hn = hwy::HWY_NAMESPACE;
using Floats = hn::CappedTag<float, 16>;
using Ints = hn::RebindToSigned<Floats>;
using Words = hn::RebindToUnsigned<Floats>;
using F = hn::Vec<Floats>;
using I = hn::Vec<Ints>;
using W = hn::Vec<Words>;

HWY_INLINE F set(float value) {
  return hn::Set(Floats(), value);
}

HWY_INLINE F toFloats(I ints) {
  return hn::ConvertTo(Floats(), ints);
}

struct Colour {
  F r, g, b;
};

HWY_INLINE Colour coloursOf(W pixels) {
  // Red in the low byte: every target is little-endian.
  const W byte = hn::Set(Words(), 0xFFu);
  return {toFloats(hn::BitCast(Ints(), hn::And(pixels, byte))),
          toFloats(hn::BitCast(Ints(), hn::And(hn::ShiftRight<8>(pixels), byte))),
          toFloats(hn::BitCast(Ints(), hn::And(hn::ShiftRight<16>(pixels), byte)))};
}

/// `softLight` for masks up to 0.5.
HWY_INLINE F darkened(F x, F mask) {
  const F strength =
      hn::Sub(set(soft_light::strength), hn::Mul(mask, set(soft_light::strengthPerMask)));
  return hn::Sub(x, hn::Mul(hn::Mul(strength, x), hn::Sub(set(255.0f), x)));
}

/// `softLight` for masks above 0.5.
HWY_INLINE F lightened(F x, F mask) {
  using namespace soft_light;
  F cubic = hn::Sub(hn::Mul(set(cubic3), x), set(cubic2));
  cubic = hn::Mul(hn::Add(hn::Mul(cubic, x), set(cubic1)), x);
  const F root = hn::Mul(set(rootGain), simd::squareRoot(x));
  const F lightest = hn::IfThenElse(hn::Le(x, set(quarter)), cubic, root);
  const F strength = hn::Sub(hn::Mul(set(2.0f), mask), set(1.0f));
  return hn::Add(x, hn::Mul(strength, hn::Sub(lightest, x)));
}

HWY_INLINE Colour vignetted(const Colour& c, F mask, float opacity) {
  const auto dark = hn::Le(mask, set(0.5f));
  Colour blend{darkened(c.r, mask), darkened(c.g, mask), darkened(c.b, mask)};
  // Most of a picture is dark and spared the roots.
  if (!hn::AllTrue(Floats(), dark)) {
    blend.r = hn::IfThenElse(dark, blend.r, lightened(c.r, mask));
    blend.g = hn::IfThenElse(dark, blend.g, lightened(c.g, mask));
    blend.b = hn::IfThenElse(dark, blend.b, lightened(c.b, mask));
  }
  if (opacity == 1.0f) return blend;
  const auto over = [&](F above, F below) HWY_ATTR {
    return hn::Add(hn::Mul(set(opacity), above), hn::Mul(set(1.0f - opacity), below));
  };
  return {over(blend.r, c.r), over(blend.g, c.g), over(blend.b, c.b)};
}

template <ChannelMix mix>
HWY_INLINE Colour mixed(const Colour& c) {
  const auto sum = [](F r, F g, F b) HWY_ATTR { return hn::Add(hn::Add(r, g), b); };
  if constexpr (mix == ChannelMix::none) {
    return c;
  } else if constexpr (mix == ChannelMix::grey) {
    const F grey = sum(hn::Mul(set(greyMix.r), c.r), hn::Mul(set(greyMix.g), c.g),
                       hn::Mul(set(greyMix.b), c.b));
    return {grey, grey, grey};
  } else {
    const F own = set(fadedOwn), other = set(fadedOther);
    const Colour owns{hn::Mul(own, c.r), hn::Mul(own, c.g), hn::Mul(own, c.b)};
    const Colour others{hn::Mul(other, c.r), hn::Mul(other, c.g), hn::Mul(other, c.b)};
    return {sum(owns.r, others.g, others.b), sum(others.r, owns.g, others.b),
            sum(others.r, others.g, owns.b)};
  }
}

/// Two neighbouring samples of a curve.
struct Segment {
  F lower, upper;
};

/// A curve of any length.
class LongCurve {
 public:
  explicit LongCurve(const DirectLook::Curve& curve)
      : samples_(curve.samples.data()), last_(curve.last) {}

  HWY_INLINE Segment at(I index) const {
    const I held = hn::Min(index, hn::Set(Ints(), last_));
    return {hn::GatherIndex(Floats(), samples_, held),
            hn::GatherIndex(Floats(), samples_ + 1, held)};
  }

 private:
  const float* samples_;
  std::int32_t last_;
};

#if HWY_TARGET <= HWY_AVX2
/// A curve of at most `DirectLook::shortCurve` samples, which no index exceeds.
class ShortCurve {
 public:
  HWY_INLINE explicit ShortCurve(const DirectLook::Curve& curve) : samples_(curve.samples.data()) {}

  HWY_INLINE Segment at(I index) const {
    return {samples_(index), samples_(hn::Add(index, hn::Set(Ints(), 1)))};
  }

 private:
  simd::SmallTable samples_;
};
#else
// Gathers are loops here, which do better with the same indices for both samples.
using ShortCurve = LongCurve;
#endif

/// Where a value lies in a curve.
struct Place {
  I index;
  F fraction;
};

HWY_INLINE Place placeOf(F value, float samplesPerUnit) {
  const F position = hn::Mul(value, set(samplesPerUnit));
  const I index = simd::truncate(position);
  return {index, hn::Sub(position, toFloats(index))};
}

template <typename Curve>
HWY_INLINE W byteAt(const Curve& curve, const Place& place) {
  const Segment segment = curve.at(place.index);
  const F y = hn::Add(hn::Mul(place.fraction, segment.upper),
                      hn::Mul(hn::Sub(set(1.0f), place.fraction), segment.lower));
  const I whole = simd::truncate(hn::Max(y, hn::Zero(Floats())));
  return hn::And(hn::BitCast(Words(), whole), hn::Set(Words(), 0xFFu));
}

#undef PELORIN_GREY_BY_FOURS
#if HWY_TARGET == HWY_SSSE3 || HWY_TARGET == HWY_SSE4 || \
    (HWY_TARGET == HWY_NEON && HWY_ARCH_ARM_A64)
#define PELORIN_GREY_BY_FOURS
/// Without gathers, three curves over the same grey are one of vectors: a load for each end of a segment.
class CurveOfFours {
 public:
  explicit CurveOfFours(const DirectLook& direct)
      : samples_(direct.fours.data()),
        last_(direct.curves[0].last),
        samplesPerUnit_(direct.curves[0].samplesPerUnit) {}

  /// The pixels of four greys, with a 0 for alpha.
  HWY_INLINE W at(F grey) const {
    const F position = hn::Mul(grey, set(samplesPerUnit_));
    const I index = hn::Min(simd::truncateSmall(position), hn::Set(Ints(), last_));
    const F fraction = hn::Sub(position, simd::wholePart(position));
    const F rest = hn::Sub(set(1.0f), fraction);
    const hn::Repartition<std::int16_t, Ints> shorts;
    const hn::Half<hn::Repartition<std::uint8_t, Ints>> bytes;
    const auto first = hn::ReorderDemote2To(shorts, pixel<0>(index, fraction, rest),
                                            pixel<1>(index, fraction, rest));
    const auto second = hn::ReorderDemote2To(shorts, pixel<2>(index, fraction, rest),
                                             pixel<3>(index, fraction, rest));
    return hn::BitCast(
        Words(), hn::Combine(hn::Repartition<std::uint8_t, Ints>(), hn::DemoteTo(bytes, second),
                             hn::DemoteTo(bytes, first)));
  }

 private:
  template <int lane>
  HWY_INLINE I pixel(I index, F fraction, F rest) const {
    const float* lower = samples_ + 4 * hn::ExtractLane(index, lane);
    const F y = hn::Add(hn::Mul(hn::Broadcast<lane>(fraction), hn::LoadU(Floats(), lower + 4)),
                        hn::Mul(hn::Broadcast<lane>(rest), hn::LoadU(Floats(), lower)));
    return hn::And(simd::truncateSmall(hn::Max(y, hn::Zero(Floats()))), hn::Set(Ints(), 0xFF));
  }

  const float* samples_;
  std::int32_t last_;
  float samplesPerUnit_;
};
#endif

template <ChannelMix mix, bool vignette, typename Curve>
void applyToVectors(const DirectLook& direct, const VignetteRow& row, const RGBA8Pixel* from,
                    RGBA8Pixel* to, std::size_t count) {
  // Copies, since `to` might be anything the arguments refer to.
  const Curve red(direct.curves[0]), green(direct.curves[1]), blue(direct.curves[2]);
  const float redSteps = direct.curves[0].samplesPerUnit;
  const float greenSteps = direct.curves[1].samplesPerUnit;
  const float blueSteps = direct.curves[2].samplesPerUnit;
  const bool samePlaces = mix == ChannelMix::grey && direct.stepsAreEqual;
  const VignetteRow coordinates = row;
  const float* const masks = vignette ? direct.look.vignette->samples().data() : nullptr;
  const float opacity = direct.look.maskAlpha;
#ifdef PELORIN_GREY_BY_FOURS
  const CurveOfFours fours(direct);
#endif

  for (std::size_t i = 0; i < count; i += hn::Lanes(Floats())) {
    prefetchAhead(from + i);
    prefetchAhead(to + i);
    const W pixels = hn::LoadU(Words(), reinterpret_cast<const std::uint32_t*>(from + i));
    Colour c = coloursOf(pixels);
    if constexpr (vignette) {
      const I sample = simd::maskSamples(Floats(), coordinates, coordinates.uSquares + i);
      c = vignetted(c, hn::GatherIndex(Floats(), masks, sample), opacity);
    }
    c = mixed<mix>(c);
#ifdef PELORIN_GREY_BY_FOURS
    if (mix == ChannelMix::grey && samePlaces) {
      const W alpha = hn::And(pixels, hn::Set(Words(), 0xFF000000u));
      hn::StoreU(hn::Or(alpha, fours.at(c.r)), Words(), reinterpret_cast<std::uint32_t*>(to + i));
      continue;
    }
#endif
    const Place r = placeOf(c.r, redSteps);
    const Place g = samePlaces ? r : placeOf(c.g, greenSteps);
    const Place b = samePlaces ? r : placeOf(c.b, blueSteps);
    W result = hn::And(pixels, hn::Set(Words(), 0xFF000000u));
    result = hn::Or(result, byteAt(red, r));
    result = hn::Or(result, hn::ShiftLeft<8>(byteAt(green, g)));
    result = hn::Or(result, hn::ShiftLeft<16>(byteAt(blue, b)));
    hn::StoreU(result, Words(), reinterpret_cast<std::uint32_t*>(to + i));
  }
}

#if HWY_TARGET == HWY_WASM
/// The same in short stages over blocks: V8's code is as slow as its chains of operations are long.
namespace grey {

struct alignas(16) Four {
  std::int32_t masks[4];
  std::int32_t segments[4];  ///< In `fours`.
  float fractions[4];
};

HWY_NOINLINE void findMasks(const float* masks, const VignetteRow& row, const float* uSquares,
                            std::size_t fours, Four* block) {
  for (std::size_t i = 0; i < fours; ++i, uSquares += 4) {
    const F square = hn::Add(hn::LoadU(Floats(), uSquares), set(row.vSquare));
    const F last = set(row.lastSample);
    simd::findEntries(masks, hn::Min(hn::Mul(square, last), last), block[i].masks);
  }
}

/// What `lightened` adds to each code, for masks of 1.
struct Lightening {
  float ofCode[256];

  Lightening() {
    using namespace soft_light;
    for (int code = 0; code < 256; ++code) {
      const auto x = static_cast<float>(code);
      const float cubic = ((cubic3 * x - cubic2) * x + cubic1) * x;
      ofCode[code] = (x <= quarter ? cubic : rootGain * std::sqrt(x)) - x;
    }
  }

  /// Of every fourth code.
  HWY_INLINE F of(const std::uint8_t* codes) const {
    auto lanes = wasm_v128_load32_zero(ofCode + codes[0]);
    lanes = wasm_v128_load32_lane(ofCode + codes[4], lanes, 1);
    lanes = wasm_v128_load32_lane(ofCode + codes[8], lanes, 2);
    return F{wasm_v128_load32_lane(ofCode + codes[12], lanes, 3)};
  }
};

HWY_INLINE Colour vignettedPixels(const Lightening& lightening, const RGBA8Pixel* from,
                                  const Colour& c, F mask, float opacity) {
  const int areDark = wasm_i32x4_bitmask(hn::Le(mask, set(0.5f)).raw);
  if (areDark != 0) return vignetted(c, mask, opacity);
  const F strength = hn::Sub(hn::Mul(set(2.0f), mask), set(1.0f));
  const auto blended = [&](F x, const std::uint8_t& codes) HWY_ATTR {
    const F light = hn::Add(x, hn::Mul(strength, lightening.of(&codes)));
    if (opacity == 1.0f) return light;
    return hn::Add(hn::Mul(set(opacity), light), hn::Mul(set(1.0f - opacity), x));
  };
  return {blended(c.r, from->r), blended(c.g, from->g), blended(c.b, from->b)};
}

template <bool vignette>
HWY_NOINLINE void findSegments(const DirectLook& direct, const RGBA8Pixel* from, std::size_t fours,
                               Four* block) {
  static const Lightening lightening;
  for (std::size_t i = 0; i < fours; ++i, from += 4) {
    Colour c = coloursOf(hn::LoadU(Words(), reinterpret_cast<const std::uint32_t*>(from)));
    if constexpr (vignette) {
      c = vignettedPixels(lightening, from, c, simd::read(block[i].masks), direct.look.maskAlpha);
    }
    const F position = hn::Mul(mixed<ChannelMix::grey>(c).r, set(direct.curves[0].samplesPerUnit));
    const F whole = hn::Trunc(position);
    const F last = set(static_cast<float>(direct.curves[0].last));
    simd::findEntriesAtWhole<4>(direct.fours.data(), hn::Min(whole, last), block[i].segments);
    hn::Store(hn::Sub(position, whole), Floats(), block[i].fractions);
  }
}

HWY_NOINLINE void paint(const RGBA8Pixel* from, RGBA8Pixel* to, std::size_t fours,
                        const Four* block) {
  for (std::size_t i = 0; i < fours; ++i, from += 4, to += 4) {
    const auto codes = [&](int lane) HWY_ATTR {
      const auto* segment = reinterpret_cast<const float*>(block[i].segments[lane]);
      const F fraction{wasm_v128_load32_splat(&block[i].fractions[lane])};
      const F y = hn::Add(hn::Mul(fraction, hn::LoadU(Floats(), segment + 4)),
                          hn::Mul(hn::Sub(set(1.0f), fraction), hn::LoadU(Floats(), segment)));
      // In the sum with this number, a whole one is the mantissa.
      const F whole = hn::Add(hn::Trunc(hn::Max(y, hn::Zero(Floats()))), set(0x1p23f));
      return wasm_v128_and(whole.raw, wasm_i32x4_splat(0xFF));
    };
    const auto first = wasm_i16x8_narrow_i32x4(codes(0), codes(1));
    const auto second = wasm_i16x8_narrow_i32x4(codes(2), codes(3));
    const auto alpha = wasm_v128_and(wasm_v128_load(from), wasm_u32x4_splat(0xFF000000u));
    wasm_v128_store(to, wasm_v128_or(wasm_u8x16_narrow_i16x8(first, second), alpha));
  }
}

template <bool vignette>
void apply(const DirectLook& direct, const VignetteRow& row, const RGBA8Pixel* from, RGBA8Pixel* to,
           std::size_t count) {
  constexpr std::size_t most = 64;
  Four block[most];
  const VignetteRow coordinates = row;  // `to` might be anything the row refers to
  for (std::size_t i = 0; i < count; i += 4 * most) {
    const std::size_t fours = std::min(most, (count - i) / 4);
    if constexpr (vignette) {
      findMasks(direct.look.vignette->samples().data(), coordinates, coordinates.uSquares + i,
                fours, block);
    }
    findSegments<vignette>(direct, from + i, fours, block);
    paint(from + i, to + i, fours, block);
  }
}

}  // namespace grey
#endif

template <ChannelMix mix, bool vignette>
void applyMix(const DirectLook& direct, const VignetteRow& row, const RGBA8Pixel* from,
              RGBA8Pixel* to, std::size_t count) {
  auto apply = direct.curvesAreShort ? applyToVectors<mix, vignette, ShortCurve>
                                     : applyToVectors<mix, vignette, LongCurve>;
#if HWY_TARGET == HWY_WASM
  if (mix == ChannelMix::grey && direct.stepsAreEqual) apply = grey::apply<vignette>;
#endif
  const std::size_t lanes = hn::Lanes(Floats());
  const std::size_t left = count % lanes, whole = count - left;
  apply(direct, row, from, to, whole);
  if (left == 0) return;
  // The pixels that fill no vector, in one of their own.
  RGBA8Pixel pixels[hn::MaxLanes(Floats())] = {};
  float squares[hn::MaxLanes(Floats())] = {};
  std::copy_n(from + whole, left, pixels);
  if constexpr (vignette) std::copy_n(row.uSquares + whole, left, squares);
  apply(direct, {squares, row.vSquare, row.lastSample}, pixels, pixels, lanes);
  std::copy_n(pixels, left, to + whole);
}

template <bool vignette>
void applyLook(const DirectLook& direct, const VignetteRow& row, const RGBA8Pixel* from,
               RGBA8Pixel* to, std::size_t count) {
  switch (direct.look.mix) {
    case ChannelMix::none:
      return applyMix<ChannelMix::none, vignette>(direct, row, from, to, count);
    case ChannelMix::grey:
      return applyMix<ChannelMix::grey, vignette>(direct, row, from, to, count);
    case ChannelMix::faded:
      return applyMix<ChannelMix::faded, vignette>(direct, row, from, to, count);
  }
}

void applyDirectLook(const DirectLook& direct, const VignetteRow& row, const RGBA8Pixel* from,
                     RGBA8Pixel* to, std::size_t count) {
  const auto apply = direct.look.vignette != nullptr ? applyLook<true> : applyLook<false>;
  apply(direct, row, from, to, count);
}

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
namespace pelorin::image_processing {
HWY_EXPORT(applyDirectLook);
void applyDirectLook(const DirectLook& direct, const VignetteRow& row, const RGBA8Pixel* from,
                     RGBA8Pixel* to, std::size_t count) {
  HWY_DYNAMIC_DISPATCH(applyDirectLook)(direct, row, from, to, count);
}
}  // namespace pelorin::image_processing
#endif
