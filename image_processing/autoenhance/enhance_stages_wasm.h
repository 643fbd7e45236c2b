// The stages of enhance_row_simd.cpp for WebAssembly, which reads tables a lane at a time: included by it alone.
//
// What one stage finds in a table is for the next one to read. All stages are short, since a processor's window
// holds few vectors of four lanes otherwise, and what they leave of four pixels stands together, so that one
// pointer reaches all of it.
#pragma once

#include <hwy/highway.h>

#include "image_processing/autoenhance/colour/colour_tables.h"
#include "image_processing/autoenhance/colour/lab_simd.h"
#include "image_processing/autoenhance/colour/vibrance_simd.h"
#include "image_processing/autoenhance/enhance_row.h"
#include "image_processing/core/entries_wasm.h"

namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
namespace stages {
namespace hn = hwy::HWY_NAMESPACE;
using lab::F;
using lab::Floats;
using lab::product;
using lab::set;
using Ints = hn::RebindToSigned<Floats>;
using Words = hn::RebindToUnsigned<Floats>;
using simd::findEntries;
using simd::read;
using simd::readPairs;

/// What the stages leave to each other of four pixels.
struct alignas(16) Four {
  std::int32_t steps[4][4];  ///< Of each pixel those of X, Y, Z in `ofSteps`.
  std::int32_t baseInCurve[4];
  float baseFraction[4];
  float redness[4], yellowness[4];  // fx - fy, fy - fz by way of a, b
  float L[4];
  std::int32_t xyz[3][4];    ///< In the inverse tables.
  std::int32_t codes[3][4];  ///< Of red, green and blue.
  float rgb[3][4];
  float grey[4], gain[4];
};

/// Linear light times its shares of X, Y and Z, by channel and code: the product of a table entry and a
/// constant is the same float whenever it is formed.
struct Shares {
  alignas(16) float of[3][256][4];

  Shares() {
    const auto fill = [](float* shares, float light, float x, float y, float z) {
      shares[0] = x * light;
      shares[1] = y * light;
      shares[2] = z * light;
      shares[3] = 0.0f;
    };
    for (int code = 0; code < 256; ++code) {
      const float light = sRGBToLinearTable[code];
      fill(of[0][code], light, xOfRgb.first, yOfRgb.first, zOfRgb.first);
      fill(of[1][code], light, xOfRgb.second, yOfRgb.second, zOfRgb.second);
      fill(of[2][code], light, xOfRgb.third, yOfRgb.third, zOfRgb.third);
    }
  }
};

/// The steps of Lab's companding that X, Y and Z fall on.
HWY_NOINLINE void findSteps(const float* ofSteps, const RGBA8Pixel* in, std::size_t fours,
                            Four* block) {
  static const Shares shares;
  for (std::size_t i = 0; i < fours; ++i, in += 4) {
    for (int pixel = 0; pixel < 4; ++pixel) {
      const F red = hn::Load(Floats(), shares.of[0][in[pixel].r]);
      const F green = hn::Load(Floats(), shares.of[1][in[pixel].g]);
      const F blue = hn::Load(Floats(), shares.of[2][in[pixel].b]);
      const F step = hn::Mul(hn::Add(hn::Add(red, green), blue), set(compandingSamples - 1));
      findEntries<2>(ofSteps, step, block[i].steps[pixel]);
    }
  }
}

HWY_INLINE F valuesOf(const float* mask) {
  return hn::LoadU(Floats(), mask);
}
HWY_INLINE F valuesOf(const QuantizedFloat<unsigned char>* mask) {
  const auto bytes =
      hn::LoadU(hn::Rebind<std::uint8_t, Floats>(), reinterpret_cast<const std::uint8_t*>(mask));
  return hn::Div(hn::ConvertTo(Floats(), hn::PromoteTo(Ints(), bytes)),
                 set(QuantizedFloat<unsigned char>::codesPerUnit));
}

/// Where the bases of local contrast lie in the curve.
template <typename Mask>
HWY_NOINLINE void findBases(const TonePass& pass, const float* curve, const Mask* bilateral,
                            std::size_t fours, Four* block) {
  for (std::size_t i = 0; i < fours; ++i, bilateral += 4) {
    const F base = hn::Mul(set(pass.scale), valuesOf(bilateral));
    const F place = hn::Mul(base, set(pass.samplesPerUnit));
    const F whole = hn::Trunc(place);
    simd::findEntriesAtWhole(curve, whole, block[i].baseInCurve);
    hn::Store(hn::Sub(place, whole), Floats(), block[i].baseFraction);
  }
}

/// To Lab, with L tone-mapped and, with masks, recombined.
template <bool masked, typename Mask>
HWY_NOINLINE void mapTones(const TonePass& pass, const Mask* bilateral, const Mask* ltm,
                           std::size_t fours, Four* block) {
  for (std::size_t i = 0; i < fours; ++i) {
    const std::int32_t* const steps = block[i].steps[0];
    const F fx = read<4>(steps);
    const auto [fy, mapped] = readPairs<4>(steps + 1);
    const F fz = read<4>(steps + 2);
    const F a = hn::Mul(set(labAGain), hn::Sub(fx, fy));
    const F b = hn::Mul(set(labBGain), hn::Sub(fy, fz));
    hn::Store(hn::Div(a, set(labAGain)), Floats(), block[i].redness);
    hn::Store(hn::Div(b, set(labBGain)), Floats(), block[i].yellowness);

    F L = mapped;
    if constexpr (masked) {
      const auto [lower, upper] = readPairs(block[i].baseInCurve);
      const F fraction = hn::Load(Floats(), block[i].baseFraction);
      const F mappedBase =
          hn::Add(hn::Mul(fraction, upper), hn::Mul(hn::Sub(set(1.0f), fraction), lower));
      const F base = hn::Mul(set(pass.scale), valuesOf(bilateral + 4 * i));
      const F flat = valuesOf(ltm + 4 * i);
      const F detail = hn::Sub(lab::lightness(fy), base);
      const F blended = hn::Add(hn::Mul(set(pass.ltmBlend), mappedBase),
                                hn::Mul(set(1.0f - pass.ltmBlend), mapped));
      const F detailed = hn::Add(mapped, hn::Mul(set(pass.detailGain), detail));
      L = hn::Add(hn::Mul(flat, blended), hn::Mul(hn::Sub(set(1.0f), flat), detailed));
      L = simd::clampTo(L, hn::Zero(Floats()), set(pass.scale));
    }
    hn::Store(L, Floats(), block[i].L);
  }
}

/// `value` times `last`, held to 0 ... `last`.
HWY_INLINE F placeOf(F value, F scale, F last) {
  return simd::clampTo(hn::Mul(value, scale), hn::Zero(Floats()), last);
}

/// From Lab to places of X, Y and Z in the inverse tables.
HWY_NOINLINE void findXyz(std::size_t fours, Four* block) {
  const float* const toXz = colourTables().labToXz.samples().data();
  const float* const toY = colourTables().labToY.samples().data();
  const F last = set(lab::lastInverseSample);
  for (std::size_t i = 0; i < fours; ++i) {
    const F L = hn::Load(Floats(), block[i].L);
    const F fy = hn::Div(hn::Add(L, set(labLOffset)), set(labLGain));
    const F fx = hn::Add(hn::Load(Floats(), block[i].redness), fy);
    const F fz = hn::Sub(fy, hn::Load(Floats(), block[i].yellowness));
    findEntries(toXz, placeOf(fx, last, last), block[i].xyz[0]);
    findEntries(toY, placeOf(L, set(lab::lastInverseSample / labWhite), last), block[i].xyz[1]);
    findEntries(toXz, placeOf(fz, last, last), block[i].xyz[2]);
  }
}

/// From these to places of the codes of sRGB.
HWY_NOINLINE void findCodes(std::size_t fours, Four* block) {
  const float* const codes = colourTables().codes.data();
  const F last = set(sRGBSteps - 1);
  for (std::size_t i = 0; i < fours; ++i) {
    const F X = read(block[i].xyz[0]);
    const F Y = read(block[i].xyz[1]);
    const F Z = read(block[i].xyz[2]);
    findEntries(codes, placeOf(product(redOfXyz, X, Y, Z), last, last), block[i].codes[0]);
    findEntries(codes, placeOf(product(greenOfXyz, X, Y, Z), last, last), block[i].codes[1]);
    findEntries(codes, placeOf(product(blueOfXyz, X, Y, Z), last, last), block[i].codes[2]);
  }
}

/// How far vibrance takes the channels from their grey.
HWY_NOINLINE void findGains(float vibrance, std::size_t fours, Four* block) {
  for (std::size_t i = 0; i < fours; ++i) {
    const F r = read(block[i].codes[0]);
    const F g = read(block[i].codes[1]);
    const F b = read(block[i].codes[2]);
    const F grey = vibranceGrey(r, g, b);
    hn::Store(r, Floats(), block[i].rgb[0]);
    hn::Store(g, Floats(), block[i].rgb[1]);
    hn::Store(b, Floats(), block[i].rgb[2]);
    hn::Store(grey, Floats(), block[i].grey);
    hn::Store(vibranceGain(vibrance, r, g, b, grey), Floats(), block[i].gain);
  }
}

/// The pixels.
HWY_NOINLINE void paint(const RGBA8Pixel* in, RGBA8Pixel* out, std::size_t fours,
                        const Four* block) {
  for (std::size_t i = 0; i < fours; ++i, in += 4, out += 4) {
    const F grey = hn::Load(Floats(), block[i].grey);
    const F gain = hn::Load(Floats(), block[i].gain);
    // Above a code is the exponent, which is shifted out of two of them.
    const auto code = [&](const float* channel) HWY_ATTR {
      const F scaled = hn::Add(grey, hn::Mul(gain, hn::Sub(hn::Load(Floats(), channel), grey)));
      return hn::BitCast(Words(), hn::Add(hn::Trunc(scaled), set(0x1p23f)));
    };
    const auto pixels = hn::LoadU(Words(), reinterpret_cast<const std::uint32_t*>(in));
    const auto alpha = hn::And(pixels, hn::Set(Words(), 0xFF000000u));
    const auto red = hn::And(code(block[i].rgb[0]), hn::Set(Words(), 0xFFu));
    const auto green = hn::ShiftLeft<8>(code(block[i].rgb[1]));
    const auto blue = hn::ShiftLeft<16>(code(block[i].rgb[2]));
    hn::StoreU(hn::Or(hn::Or(alpha, red), hn::Or(green, blue)), Words(),
               reinterpret_cast<std::uint32_t*>(out));
  }
}

/// All of it for `count` pixels, whole fours and at most a block.
template <bool masked, typename Mask>
HWY_INLINE void enhanceBlock(const TonePass& pass, const PreparedTonePass::Tables& tables,
                             const RGBA8Pixel* in, const Mask* bilateral, const Mask* ltm,
                             RGBA8Pixel* out, std::size_t count, Four* block) {
  const std::size_t fours = count / 4;
  findSteps(tables.ofSteps, in, fours, block);
  if constexpr (masked) findBases(pass, tables.samples, bilateral, fours, block);
  mapTones<masked>(pass, bilateral, ltm, fours, block);
  findXyz(fours, block);
  findCodes(fours, block);
  findGains(pass.vibrance, fours, block);
  paint(in, out, fours, block);
}

}  // namespace stages
}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
