#include "image_processing/autoenhance/enhance_row.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/autoenhance/enhance_row_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include "image_processing/autoenhance/colour_tables.h"
#include "image_processing/core/simd.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
namespace hn = hwy::HWY_NAMESPACE;
using Floats = hn::CappedTag<float, 16>;
using Ints = hn::RebindToSigned<Floats>;
using F = hn::Vec<Floats>;
using I = hn::Vec<Ints>;

HWY_INLINE F set(float value) {
  return hn::Set(Floats(), value);
}
HWY_INLINE F toFloats(I ints) {
  return hn::ConvertTo(Floats(), ints);
}

/// Index of a table look-up: toward zero, held to the table. `place` is an ordinary number.
HWY_INLINE I tableIndex(F place, float last) {
  return hn::ConvertTo(Ints(), simd::clampTo(place, hn::Zero(Floats()), set(last)));
}

HWY_INLINE F lookUp(const float* table, I index) {
  return hn::GatherIndex(Floats(), table, index);
}

/// The flat arrays behind the process's tables.
struct Tables {
  const float* linear = colourTables().linear.data();
  const float* xyzToLab = colourTables().xyzToLab.samples().data();
  const float* labToXz = colourTables().labToXz.samples().data();
  const float* labToY = colourTables().labToY.samples().data();
  const std::int32_t* encode = colourTables().codes.data();
};

struct Colour {
  F r, g, b;
};

HWY_INLINE F companded(const Tables& tables, const Colour& c, float r, float g, float b) {
  F sum = hn::Mul(set(r), c.r);
  sum = hn::Add(sum, hn::Mul(set(g), c.g));
  sum = hn::Add(sum, hn::Mul(set(b), c.b));
  return lookUp(tables.xyzToLab, tableIndex(hn::Mul(sum, set(9999.0f)), 9999.0f));
}

HWY_INLINE F encoded(const Tables& tables, F x, F y, F z, float fromX, float fromY, float fromZ) {
  F sum = hn::Mul(set(fromX), x);
  sum = hn::Add(sum, hn::Mul(set(fromY), y));
  sum = hn::Add(sum, hn::Mul(set(fromZ), z));
  const I index = tableIndex(hn::Mul(sum, set(1023.0f)), 1023.0f);
  return toFloats(hn::GatherIndex(Ints(), tables.encode, index));
}

/// The tone curve; `place` (L times samples a unit) lies in [0, last + 1).
HWY_INLINE F toneMapped(const TonePass& pass, F place) {
  const I last = hn::Set(Ints(), static_cast<std::int32_t>(pass.curve.size() - 1));
  const I lower = hn::ConvertTo(Ints(), place);
  const I upper = hn::Min(hn::Add(lower, hn::Set(Ints(), 1)), last);
  const F fraction = hn::Sub(place, toFloats(lower));
  return hn::Add(hn::Mul(fraction, lookUp(pass.curve.data(), upper)),
                 hn::Mul(hn::Sub(set(1.0f), fraction), lookUp(pass.curve.data(), lower)));
}

HWY_INLINE F loadMask(const float* mask) {
  return hn::LoadU(Floats(), mask);
}
HWY_INLINE F loadMask(const QuantizedFloat<unsigned char>* mask) {
  const hn::Rebind<std::uint8_t, Floats> bytes;
  const auto stored = hn::LoadU(bytes, reinterpret_cast<const std::uint8_t*>(mask));
  return simd::divide(toFloats(hn::PromoteTo(Ints(), stored)), set(255.0f));
}

/// `vibranceInRGB` for amounts from 0 on.
HWY_INLINE void addVibrance(float amount, Colour& c) {
  const F highest = hn::Max(hn::Max(c.r, c.g), c.b);
  const F lowest = hn::Min(hn::Min(c.r, c.g), c.b);
  F grey = hn::Mul(set(0.7f), c.g);
  grey = hn::Add(grey, hn::Mul(set(0.2f), c.r));
  grey = hn::Add(grey, hn::Mul(set(0.1f), c.b));
  const F roomAbove = simd::divide(hn::Sub(set(255.0f), grey), hn::Sub(highest, grey));
  const F roomBelow = simd::divide(hn::Neg(grey), hn::Sub(lowest, grey));
  const F room = hn::Min(roomAbove, roomBelow);
  F gain = hn::IfThenElse(hn::Lt(room, set(amount)), room, set(amount));
  if (amount > 1.0f) {
    const F lead = hn::Sub(hn::Max(c.g, c.b), c.r);
    const F notRed = simd::clampTo(simd::divide(lead, set(5.0f)), hn::Zero(Floats()), set(1.0f));
    gain = hn::Add(hn::Sub(set(1.0f), notRed), hn::Mul(notRed, gain));
  }
  const auto coloured = hn::Ne(highest, lowest);  // a grey pixel's room is 0 / 0
  const auto scaled = [&](F channel) HWY_ATTR {
    return hn::IfThenElse(coloured, hn::Add(grey, hn::Mul(gain, hn::Sub(channel, grey))), channel);
  };
  c = {scaled(c.r), scaled(c.g), scaled(c.b)};
}

template <typename Mask>
HWY_INLINE void enhanceRowVector(const TonePass& pass, const RGBA8Pixel* in, const Mask* bilateral,
                                 const Mask* ltm, RGBA8Pixel* out, std::size_t count) {
  const Tables tables;
  const hn::RebindToUnsigned<Floats> words;
  const std::size_t lanes = hn::Lanes(Floats());
  const F beyond = set(static_cast<float>(pass.curve.size()));
  std::size_t i = 0;
  for (; i + lanes <= count; i += lanes) {
    // Red in the low byte: every target is little-endian.
    const auto pixels = hn::LoadU(words, reinterpret_cast<const std::uint32_t*>(in + i));
    const auto byte = hn::Set(words, 0xFFu);
    const auto channel = [&](auto word) HWY_ATTR {
      return lookUp(tables.linear, hn::BitCast(Ints(), hn::And(word, byte)));
    };
    const Colour linear{channel(pixels), channel(hn::ShiftRight<8>(pixels)),
                        channel(hn::ShiftRight<16>(pixels))};
    const F fx = companded(tables, linear, 0.43394995f, 0.3762098f, 0.1898403f);
    const F fy = companded(tables, linear, 0.2126729f, 0.7151522f, 0.072175f);
    const F fz = companded(tables, linear, 0.017756583f, 0.10946796f, 0.87277544f);
    const F lightness = hn::Sub(hn::Mul(set(116.0f), fy), set(16.0f));
    const F a = hn::Mul(set(500.0f), hn::Sub(fx, fy));
    const F b = hn::Mul(set(200.0f), hn::Sub(fy, fz));

    const F mapped = toneMapped(pass, hn::Mul(lightness, set(pass.samplesPerUnit)));
    F L = mapped;
    if (bilateral != nullptr) {
      const F base = hn::Mul(set(pass.scale), loadMask(bilateral + i));
      const F flat = loadMask(ltm + i);
      const F basePlace = hn::Mul(base, set(pass.samplesPerUnit));
      // Masks of our own lie well inside; anything else, NaN included, is the definition's.
      const auto usual =
          hn::And(hn::And(hn::Ge(basePlace, hn::Zero(Floats())), hn::Lt(basePlace, beyond)),
                  hn::Lt(hn::Abs(flat), set(4.0f)));
      if (HWY_UNLIKELY(!hn::AllTrue(Floats(), usual))) {
        enhanceRowScalar(pass, in + i, bilateral + i, ltm + i, out + i, lanes);
        continue;
      }
      const F detail = hn::Sub(lightness, base);
      const F blended = hn::Add(hn::Mul(set(pass.ltmBlend), toneMapped(pass, basePlace)),
                                hn::Mul(hn::Sub(set(1.0f), set(pass.ltmBlend)), mapped));
      const F detailed = hn::Add(mapped, hn::Mul(set(pass.detailGain), detail));
      const F recombined =
          hn::Add(hn::Mul(flat, blended), hn::Mul(hn::Sub(set(1.0f), flat), detailed));
      L = simd::clampTo(recombined, hn::Zero(Floats()), set(pass.scale));
    }

    const F newFy = simd::divide(hn::Add(L, set(16.0f)), set(116.0f));
    const F xPlace = hn::Add(simd::divide(a, set(500.0f)), newFy);
    const F zPlace = hn::Sub(newFy, simd::divide(b, set(200.0f)));
    const F x = lookUp(tables.labToXz, tableIndex(hn::Mul(xPlace, set(999.0f)), 999.0f));
    const F y = lookUp(tables.labToY, tableIndex(hn::Mul(L, set(999.0f / 100.0f)), 999.0f));
    const F z = lookUp(tables.labToXz, tableIndex(hn::Mul(zPlace, set(999.0f)), 999.0f));
    Colour colour{encoded(tables, x, y, z, 3.0799544f, -1.5371385f, -0.5428159f),
                  encoded(tables, x, y, z, -0.9212582f, 1.8760108f, 0.04524742f),
                  encoded(tables, x, y, z, 0.05288738f, -0.2040259f, 1.1511385f)};
    addVibrance(pass.vibrance, colour);

    const auto code = [&](F channel)
                          HWY_ATTR { return hn::BitCast(words, hn::ConvertTo(Ints(), channel)); };
    auto result = hn::And(pixels, hn::Set(words, 0xFF000000u));
    result = hn::Or(result, code(colour.r));
    result = hn::Or(result, hn::ShiftLeft<8>(code(colour.g)));
    result = hn::Or(result, hn::ShiftLeft<16>(code(colour.b)));
    hn::StoreU(result, words, reinterpret_cast<std::uint32_t*>(out + i));
  }
  enhanceRowScalar(pass, in + i, bilateral == nullptr ? nullptr : bilateral + i,
                   ltm == nullptr ? nullptr : ltm + i, out + i, count - i);
}

void enhanceRowFloat(const TonePass& pass, const RGBA8Pixel* in, const float* bilateral,
                     const float* ltm, RGBA8Pixel* out, std::size_t count) {
  enhanceRowVector(pass, in, bilateral, ltm, out, count);
}

void enhanceRow8bit(const TonePass& pass, const RGBA8Pixel* in,
                    const QuantizedFloat<unsigned char>* bilateral,
                    const QuantizedFloat<unsigned char>* ltm, RGBA8Pixel* out, std::size_t count) {
  enhanceRowVector(pass, in, bilateral, ltm, out, count);
}

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
namespace pelorin::image_processing {

HWY_EXPORT(enhanceRowFloat);
HWY_EXPORT(enhanceRow8bit);

template <>
void enhanceRow(const TonePass& pass, const RGBA8Pixel* in, const float* bilateral,
                const float* ltm, RGBA8Pixel* out, std::size_t count) {
  if (!pass.ordinary) return enhanceRowScalar(pass, in, bilateral, ltm, out, count);
  HWY_DYNAMIC_DISPATCH(enhanceRowFloat)(pass, in, bilateral, ltm, out, count);
}

template <>
void enhanceRow(const TonePass& pass, const RGBA8Pixel* in,
                const QuantizedFloat<unsigned char>* bilateral,
                const QuantizedFloat<unsigned char>* ltm, RGBA8Pixel* out, std::size_t count) {
  if (!pass.ordinary) return enhanceRowScalar(pass, in, bilateral, ltm, out, count);
  HWY_DYNAMIC_DISPATCH(enhanceRow8bit)(pass, in, bilateral, ltm, out, count);
}

}  // namespace pelorin::image_processing
#endif
