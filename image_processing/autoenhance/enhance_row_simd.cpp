#include "image_processing/autoenhance/enhance_row.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/autoenhance/enhance_row_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include <algorithm>
#include <bit>
#include <tuple>

#include "image_processing/autoenhance/colour/colour_tables.h"
#include "image_processing/autoenhance/colour/companding_steps.h"
#include "image_processing/autoenhance/colour/lab_simd.h"
#include "image_processing/autoenhance/colour/srgb.h"
#include "image_processing/autoenhance/colour/vibrance_simd.h"
#include "image_processing/core/prefetch.h"
#include "image_processing/core/simd.h"
#include "image_processing/core/small_table.h"

#if HWY_TARGET == HWY_WASM
#include "image_processing/autoenhance/enhance_stages_wasm.h"
#endif

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
namespace hn = hwy::HWY_NAMESPACE;
using lab::F;
using lab::Floats;
using lab::product;
using lab::set;
using simd::Divisor;
using Ints = hn::RebindToSigned<Floats>;
using Words = hn::RebindToUnsigned<Floats>;
using Bytes = hn::Rebind<std::uint8_t, Floats>;
using I = hn::Vec<Ints>;
using Quantized = QuantizedFloat<unsigned char>;

HWY_INLINE F toFloats(I ints) {
  return hn::ConvertTo(Floats(), ints);
}
HWY_INLINE F lookUp(const float* table, I index) {
  return hn::GatherIndex(Floats(), table, index);
}

// Pixels go through short stages in blocks: a processor has several vectors of a stage in flight, where the
// whole way would be one long chain; a function of its own leaves each all registers for its constants. Stages
// ask for the memory they will meet two blocks on.
constexpr std::size_t blockPixels = HWY_TARGET == HWY_WASM ? 128 : 256;

/// A byte of a mask as the value it stands for.
HWY_INLINE F valueOf(I byte) {
  return simd::divide(toFloats(byte), Divisor(Quantized::codesPerUnit));
}

/// The tone curve in vectors.
class ToneMap {
 public:
  ToneMap(const TonePass& pass, const PreparedTonePass::Tables& tables)
      : tables_(tables), perUnit_(pass.samplesPerUnit) {}

  /// The curve at L from 0 on, less than one sample beyond the last.
  HWY_INLINE F operator()(F L) const {
    const F place = hn::Mul(L, set(perUnit_));
    const I index = simd::truncate(place);
    const F fraction = hn::Sub(place, toFloats(index));
    const F upper = simd::SmallTable(tables_.samples + 1)(index);
    const F lower = simd::SmallTable(tables_.samples)(index);
    return hn::Add(hn::Mul(fraction, upper), hn::Mul(hn::Sub(set(1.0f), fraction), lower));
  }
  /// The curve at the L of a step of Y.
  HWY_INLINE F ofStep(I step) const { return lookUp(tables_.ofSteps, step); }
  /// The curve at the L that a byte of a mask stands for.
  HWY_INLINE F ofByte(I byte) const { return lookUp(tables_.ofBytes, byte); }

 private:
  const PreparedTonePass::Tables& tables_;
  float perUnit_;
};

void fillTables(const TonePass& pass, PreparedTonePass::Tables& tables) {
  static_assert(compandingStepCount % hn::MaxLanes(Floats()) == 0);
  std::fill(std::copy(pass.curve.begin(), pass.curve.end(), tables.samples),
            std::end(tables.samples), pass.curve.back());
  const ToneMap toneMap(pass, tables);
  const float* const fy = colourTables().xyzToLab.samples().data();
  for (std::size_t i = 0; i < compandingStepCount; i += hn::Lanes(Floats())) {
    const F ofStep = hn::LoadU(Floats(), fy + i);
    const F mapped = toneMap(lab::lightness(ofStep));
#if HWY_TARGET == HWY_WASM
    hn::Store(hn::InterleaveLower(Floats(), ofStep, mapped), Floats(), tables.ofSteps + 2 * i);
    hn::Store(hn::InterleaveUpper(Floats(), ofStep, mapped), Floats(), tables.ofSteps + 2 * i + 4);
#else
    hn::Store(mapped, Floats(), tables.ofSteps + i);
#endif
  }
  for (std::size_t i = 0; i < 256; i += hn::Lanes(Floats())) {
    const I byte = hn::Iota(Ints(), static_cast<std::int32_t>(i));
    hn::Store(toneMap(hn::Mul(set(pass.scale), valueOf(byte))), Floats(), tables.ofBytes + i);
  }
}

/// Whether masks are in [0, 1] but for rounding, as our own are.
HWY_INLINE bool areUsual(const float* bilateral, const float* ltm, std::size_t count) {
  // As whole numbers, floats from 0 on are ordered alike; negative ones and NaN come last.
  const auto bits = [](const float* mask) HWY_ATTR {
    return hn::LoadU(Words(), reinterpret_cast<const std::uint32_t*>(mask));
  };
  auto most = hn::Zero(Words());
  for (std::size_t i = 0; i < count; i += hn::Lanes(Floats())) {
    most = hn::Max(most, hn::Max(bits(bilateral + i), bits(ltm + i)));
  }
  const auto high = hn::Set(Words(), std::bit_cast<std::uint32_t>(1.01f));
  return hn::AllFalse(Words(), hn::Gt(most, high));
}
HWY_INLINE bool areUsual(const Quantized*, const Quantized*, std::size_t) {
  return true;
}

#if HWY_TARGET == HWY_WASM
using stages::enhanceBlock;
using Block = stages::Four[blockPixels / 4];
#else
/// What the stages leave to each other of the pixels of one block.
struct Block {
  HWY_ALIGN std::int32_t xStep[blockPixels], yStep[blockPixels], zStep[blockPixels];
  HWY_ALIGN float redness[blockPixels], yellowness[blockPixels];  // fx - fy, fy - fz by way of a, b
  HWY_ALIGN float L[blockPixels];
  HWY_ALIGN float r[blockPixels], g[blockPixels], b[blockPixels];
};

/// The steps of Lab's companding that a pixel's X, Y and Z fall on.
HWY_NOINLINE void findSteps(const RGBA8Pixel* in, std::size_t count, Block& block) {
  for (std::size_t i = 0; i < count; i += hn::Lanes(Floats())) {
    prefetchAhead(in + i);
    const lab::Steps steps = lab::stepsOf(in + i);
    hn::Store(steps.x, Ints(), block.xStep + i);
    hn::Store(steps.y, Ints(), block.yStep + i);
    hn::Store(steps.z, Ints(), block.zStep + i);
  }
}

/// What recombination needs of one vector of the masks.
struct MaskTerms {
  F base, mappedBase, flat;
};

HWY_INLINE MaskTerms maskTerms(const TonePass& pass, const ToneMap& toneMap, const float* bilateral,
                               const float* ltm) {
  const F base = hn::Mul(set(pass.scale), hn::LoadU(Floats(), bilateral));
  return {base, toneMap(base), hn::LoadU(Floats(), ltm)};
}

HWY_INLINE MaskTerms maskTerms(const TonePass& pass, const ToneMap& toneMap,
                               const Quantized* bilateral, const Quantized* ltm) {
  const auto bytes = [](const Quantized* mask) HWY_ATTR {
    return hn::PromoteTo(Ints(), hn::LoadU(Bytes(), reinterpret_cast<const std::uint8_t*>(mask)));
  };
  const I base = bytes(bilateral);
  return {hn::Mul(set(pass.scale), valueOf(base)), toneMap.ofByte(base), valueOf(bytes(ltm))};
}

/// To Lab, with L tone-mapped and, with masks, recombined.
template <bool masked, typename Mask>
HWY_NOINLINE void mapTones(const TonePass& pass, const ToneMap& toneMap, const Mask* bilateral,
                           const Mask* ltm, std::size_t count, Block& block) {
  const float* const xyzToLab = colourTables().xyzToLab.samples().data();
  for (std::size_t i = 0; i < count; i += hn::Lanes(Floats())) {
    const I yStep = hn::Load(Ints(), block.yStep + i);
    const F fx = lookUp(xyzToLab, hn::Load(Ints(), block.xStep + i));
    const F fy = lookUp(xyzToLab, yStep);
    const F fz = lookUp(xyzToLab, hn::Load(Ints(), block.zStep + i));
    const F a = hn::Mul(set(labAGain), hn::Sub(fx, fy));
    const F b = hn::Mul(set(labBGain), hn::Sub(fy, fz));
    hn::Store(simd::divide(a, Divisor(labAGain)), Floats(), block.redness + i);
    hn::Store(simd::divide(b, Divisor(labBGain)), Floats(), block.yellowness + i);

    const F mapped = toneMap.ofStep(yStep);
    F L = mapped;
    if constexpr (masked) {
      prefetchAhead(bilateral + i);
      prefetchAhead(ltm + i);
      const MaskTerms mask = maskTerms(pass, toneMap, bilateral + i, ltm + i);
      const F detail = hn::Sub(lab::lightness(fy), mask.base);
      const F blended = hn::Add(hn::Mul(set(pass.ltmBlend), mask.mappedBase),
                                hn::Mul(set(1.0f - pass.ltmBlend), mapped));
      const F detailed = hn::Add(mapped, hn::Mul(set(pass.detailGain), detail));
      L = hn::Add(hn::Mul(mask.flat, blended), hn::Mul(hn::Sub(set(1.0f), mask.flat), detailed));
      L = simd::clampTo(L, hn::Zero(Floats()), set(pass.scale));
    }
    hn::Store(L, Floats(), block.L + i);
  }
}

/// From Lab to the codes of sRGB.
HWY_NOINLINE void encode(std::size_t count, Block& block) {
  const float* const codes = colourTables().codes.data();
  for (std::size_t i = 0; i < count; i += hn::Lanes(Floats())) {
    const F L = hn::Load(Floats(), block.L + i);
    const F fy = simd::divide(hn::Add(L, set(labLOffset)), Divisor(labLGain));
    const F X = lab::labToXz(hn::Add(hn::Load(Floats(), block.redness + i), fy));
    const F Y = lab::labToY(L);
    const F Z = lab::labToXz(hn::Sub(fy, hn::Load(Floats(), block.yellowness + i)));
    const auto encoded = [&](F value) HWY_ATTR {
      const F last = set(sRGBSteps - 1);
      const F place = simd::clampTo(hn::Mul(value, last), hn::Zero(Floats()), last);
      return lookUp(codes, simd::truncate(place));
    };
    hn::Store(encoded(product(redOfXyz, X, Y, Z)), Floats(), block.r + i);
    hn::Store(encoded(product(greenOfXyz, X, Y, Z)), Floats(), block.g + i);
    hn::Store(encoded(product(blueOfXyz, X, Y, Z)), Floats(), block.b + i);
  }
}

/// Vibrance, and the pixels.
HWY_NOINLINE void finish(float vibrance, const RGBA8Pixel* in, RGBA8Pixel* out, std::size_t count,
                         const Block& block) {
  for (std::size_t i = 0; i < count; i += hn::Lanes(Floats())) {
    prefetchAhead(out + i);
    F r = hn::Load(Floats(), block.r + i);
    F g = hn::Load(Floats(), block.g + i);
    F b = hn::Load(Floats(), block.b + i);
    vibranceInRGB(vibrance, r, g, b);
    const auto code = [](F channel)
                          HWY_ATTR { return hn::BitCast(Words(), simd::truncate(channel)); };
    const auto pixels = hn::LoadU(Words(), reinterpret_cast<const std::uint32_t*>(in + i));
    const auto alpha = hn::And(pixels, hn::Set(Words(), 0xFF000000u));
    const auto red = code(r), green = hn::ShiftLeft<8>(code(g)), blue = hn::ShiftLeft<16>(code(b));
    hn::StoreU(hn::Or(hn::Or(alpha, red), hn::Or(green, blue)), Words(),
               reinterpret_cast<std::uint32_t*>(out + i));
  }
}

template <bool masked, typename Mask>
HWY_INLINE void enhanceBlock(const TonePass& pass, const PreparedTonePass::Tables& tables,
                             const RGBA8Pixel* in, const Mask* bilateral, const Mask* ltm,
                             RGBA8Pixel* out, std::size_t count, Block& block) {
  findSteps(in, count, block);
  mapTones<masked>(pass, ToneMap(pass, tables), bilateral, ltm, count, block);
  encode(count, block);
  finish(pass.vibrance, in, out, count, block);
}
#endif

template <bool masked, typename Mask>
HWY_INLINE void enhanceBlocks(const TonePass& pass, const PreparedTonePass::Tables& tables,
                              const RGBA8Pixel* in, const Mask* bilateral, const Mask* ltm,
                              RGBA8Pixel* out, std::size_t count) {
  Block block;
  while (count >= hn::Lanes(Floats())) {
    const std::size_t size = std::min(blockPixels, count - count % hn::Lanes(Floats()));
    if (masked && !areUsual(bilateral, ltm, size)) {
      enhanceRowScalar(pass, in, bilateral, ltm, out, size);
    } else {
      enhanceBlock<masked>(pass, tables, in, bilateral, ltm, out, size, block);
    }
    in += size;
    out += size;
    count -= size;
    if constexpr (masked) {
      bilateral += size;
      ltm += size;
    }
  }
  enhanceRowScalar(pass, in, bilateral, ltm, out, count);
}

template <typename Mask>
void enhanceByTables(const TonePass& pass, const PreparedTonePass::Tables& tables,
                     const RGBA8Pixel* in, const Mask* bilateral, const Mask* ltm, RGBA8Pixel* out,
                     std::size_t count) {
  if (bilateral != nullptr) {
    enhanceBlocks<true>(pass, tables, in, bilateral, ltm, out, count);
  } else {
    enhanceBlocks<false>(pass, tables, in, bilateral, ltm, out, count);
  }
}

/// Every kernel of this file, for every kind of mask. The types are those of every instruction set.
using Entries = std::tuple<decltype(&fillTables), decltype(&enhanceByTables<float>),
                           decltype(&enhanceByTables<Quantized>)>;
Entries entries() {
  return {fillTables, enhanceByTables<float>, enhanceByTables<Quantized>};
}

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
namespace pelorin::image_processing {

HWY_EXPORT(entries);

PreparedTonePass::PreparedTonePass(const TonePass& pass) : pass_(pass) {
  if (!pass.ordinary) return;
  tables_.reset(new Tables);  // written below
  std::get<decltype(&HWY_NAMESPACE::fillTables)>(HWY_DYNAMIC_DISPATCH(entries)())(pass, *tables_);
}

template <typename Mask>
void PreparedTonePass::enhance(const RGBA8Pixel* in, const Mask* bilateral, const Mask* ltm,
                               RGBA8Pixel* out, std::size_t count) const {
  if (!pass_.ordinary) return enhanceRowScalar(pass_, in, bilateral, ltm, out, count);
  std::get<decltype(&HWY_NAMESPACE::enhanceByTables<Mask>)>(HWY_DYNAMIC_DISPATCH(entries)())(
      pass_, *tables_, in, bilateral, ltm, out, count);
}

template <typename Mask>
void enhanceRow(const TonePass& pass, const RGBA8Pixel* in, const Mask* bilateral, const Mask* ltm,
                RGBA8Pixel* out, std::size_t count) {
  PreparedTonePass(pass).enhance(in, bilateral, ltm, out, count);
}

using Quantized = QuantizedFloat<unsigned char>;
template void PreparedTonePass::enhance(const RGBA8Pixel*, const float*, const float*, RGBA8Pixel*,
                                        std::size_t) const;
template void PreparedTonePass::enhance(const RGBA8Pixel*, const Quantized*, const Quantized*,
                                        RGBA8Pixel*, std::size_t) const;
template void enhanceRow(const TonePass&, const RGBA8Pixel*, const float*, const float*,
                         RGBA8Pixel*, std::size_t);
template void enhanceRow(const TonePass&, const RGBA8Pixel*, const Quantized*, const Quantized*,
                         RGBA8Pixel*, std::size_t);

}  // namespace pelorin::image_processing
#endif
