// `vibrance.h` in vectors: included after <hwy/foreach_target.h> and <hwy/highway.h>, once for each
// instruction set.
#if defined(PELORIN_AUTOENHANCE_VIBRANCE_SIMD_H_) == defined(HWY_TARGET_TOGGLE)
#ifdef PELORIN_AUTOENHANCE_VIBRANCE_SIMD_H_
#undef PELORIN_AUTOENHANCE_VIBRANCE_SIMD_H_
#else
#define PELORIN_AUTOENHANCE_VIBRANCE_SIMD_H_
#endif

#include <hwy/highway.h>

#include "image_processing/autoenhance/colour/vibrance.h"
#include "image_processing/core/simd.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace hn = hwy::HWY_NAMESPACE;

/// The grey about which vibrance scales.
template <class V>
HWY_INLINE V vibranceGrey(V r, V g, V b) {
  const hn::DFromV<V> d;
  V grey = hn::Mul(hn::Set(d, vibranceGreen), g);
  grey = hn::Add(grey, hn::Mul(hn::Set(d, vibranceRed), r));
  return hn::Add(grey, hn::Mul(hn::Set(d, vibranceBlue), b));
}

/// What it scales by.
template <class V>
HWY_INLINE V vibranceGain(float amount, V r, V g, V b, V grey) {
  const hn::DFromV<V> d;
  const V one = hn::Set(d, 1.0f);
  const V highest = hn::Max(hn::Max(r, g), b);
  const V lowest = hn::Min(hn::Min(r, g), b);
  // A coloured pixel's distances are a tenth at least; a grey one's must not divide 0 by 0.
  const V least = hn::Set(d, 1.0f / 1024.0f);
  const V roomAbove =
      simd::divide(hn::Sub(hn::Set(d, 255.0f), grey), hn::Max(hn::Sub(highest, grey), least));
  const V roomBelow = simd::divide(grey, hn::Max(hn::Sub(grey, lowest), least));
  const V gain = hn::Min(hn::Min(roomAbove, roomBelow), hn::Set(d, amount));
  // A gain of 1 restores a grey pixel exactly.
  if (!(amount > 1.0f)) return hn::IfThenElse(hn::Eq(highest, lowest), one, gain);
  // Between 0 and 5, whole numbers times a fifth are the floats that a division by 5 gives.
  static_assert(vibranceFade == 5.0f);
  const V fifths = hn::Mul(hn::Sub(hn::Max(g, b), r), hn::Set(d, 1.0f / vibranceFade));
  const V notRed = simd::clampTo(fifths, hn::Zero(d), one);
  return hn::Add(hn::Sub(one, notRed), hn::Mul(notRed, gain));
}

/// `vibranceInRGB` for ordinary amounts from 0 on, of codes 0 ... 255, before it truncates.
template <class V>
HWY_INLINE void vibranceInRGB(float amount, V& r, V& g, V& b) {
  const V grey = vibranceGrey(r, g, b);
  const V gain = vibranceGain(amount, r, g, b, grey);
  const auto scaled = [&](V channel)
                          HWY_ATTR { return hn::Add(grey, hn::Mul(gain, hn::Sub(channel, grey))); };
  r = scaled(r);
  g = scaled(g);
  b = scaled(b);
}

}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();
#endif  // per-target include guard
