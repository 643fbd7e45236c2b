#include "image_processing/filters/looks/look_tables.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/filters/looks/look_tables_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include "image_processing/core/prefetch.h"
#include "image_processing/filters/looks/vignette_simd.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {

namespace hn = hwy::HWY_NAMESPACE;

constexpr std::size_t pixelsInLine = cacheLine / sizeof(RGBA8Pixel);

#if HWY_TARGET == HWY_AVX3_DL
using Bytes = hn::ScalableTag<std::uint8_t>;
using B = hn::Vec<Bytes>;

/// 256 bytes in registers.
class ByteTable {
 public:
  HWY_INLINE explicit ByteTable(const std::array<std::uint8_t, 256>& table)
      : quarters_{hn::LoadU(Bytes(), &table[0]), hn::LoadU(Bytes(), &table[64]),
                  hn::LoadU(Bytes(), &table[128]), hn::LoadU(Bytes(), &table[192])} {}

  HWY_INLINE B at(B index) const {
    const auto isOdd = hn::MaskFromVec(hn::Add(index, index));  // bit 6
    return hn::IfThenElse(hn::MaskFromVec(index), ofHalf<2>(index, isOdd), ofHalf<0>(index, isOdd));
  }

 private:
  template <int even>
  HWY_INLINE B ofHalf(B index, hn::Mask<Bytes> isOdd) const {
    const auto entry = _mm512_permutexvar_epi8(index.raw, quarters_[even].raw);
    return B{_mm512_mask_permutexvar_epi8(entry, isOdd.raw, index.raw, quarters_[even + 1].raw)};
  }

  B quarters_[4];
};

// Looks up as many pixels as fill whole vectors and returns their number.
std::size_t applyToVectors(const LookTable& table, const RGBA8Pixel* from, RGBA8Pixel* to,
                           std::size_t count) {
  const ByteTable red(table[0]), green(table[1]), blue(table[2]);
  const std::size_t lanes = hn::Lanes(Bytes());
  std::size_t i = 0;
  for (; i + lanes <= count; i += lanes) {
    for (std::size_t line = i; line < i + lanes; line += pixelsInLine) {
      prefetchAhead(from + line);
      prefetchAhead(to + line);
    }
    B r, g, b, a;
    hn::LoadInterleaved4(Bytes(), &from[i].r, r, g, b, a);
    hn::StoreInterleaved4(red.at(r), green.at(g), blue.at(b), a, Bytes(), &to[i].r);
  }
  return i;
}
#elif HWY_TARGET == HWY_WASM
/// A look by two channels at a time. Tables of all pairs stand in memory for good, which no other thread has
/// here.
class PairsTable {
 public:
  /// So many pixels take longer by one channel at a time than to fill the table.
  static constexpr std::size_t leastPixels = 1 << 18;

  /// Of red and green, then of blue and alpha.
  static const PairsTable& of(const LookTable& table) {
    static PairsTable pairs;
    for (std::size_t high = 0; high < 256; ++high) {
      fill(table[0], table[1][high], pairs.redGreen_ + 256 * high);
      fill(table[2], high, pairs.blueAlpha_ + 256 * high);
    }
    return pairs;
  }

  /// Looks up as many pixels as fill whole vectors and returns their number.
  std::size_t apply(const RGBA8Pixel* from, RGBA8Pixel* to, std::size_t count) const {
    const std::size_t whole = count - count % 4;
    for (std::size_t i = 0; i < whole; i += 4) {
      const auto* const pairs = reinterpret_cast<const std::uint16_t*>(from + i);
      const auto redGreen = lookUp(redGreen_, pairs);
      const auto blueAlpha = wasm_i32x4_shl(lookUp(blueAlpha_, pairs + 1), 16);
      wasm_v128_store(to + i,
                      wasm_v128_or(wasm_v128_and(redGreen, wasm_i32x4_splat(0xFFFF)), blueAlpha));
    }
    return whole;
  }

 private:
  static void fill(const std::array<std::uint8_t, 256>& low, std::size_t high, std::uint16_t* row) {
    const hn::ScalableTag<std::uint16_t> words;
    const auto highs = hn::Set(words, static_cast<std::uint16_t>(high << 8));
    for (std::size_t i = 0; i < 256; i += hn::Lanes(words)) {
      const auto lows =
          hn::PromoteTo(words, hn::LoadU(hn::Rebind<std::uint8_t, decltype(words)>(), &low[i]));
      hn::Store(hn::Or(highs, lows), words, row + i);
    }
  }

  /// Entries of four pairs, each with the one after it above it.
  static HWY_INLINE v128_t lookUp(const std::uint16_t* table, const std::uint16_t* pairs) {
    auto entries = wasm_v128_load32_zero(table + pairs[0]);
    entries = wasm_v128_load32_lane(table + pairs[2], entries, 1);
    entries = wasm_v128_load32_lane(table + pairs[4], entries, 2);
    return wasm_v128_load32_lane(table + pairs[6], entries, 3);
  }

  HWY_ALIGN std::uint16_t redGreen_[65536], blueAlpha_[65536 + 1];
};

std::size_t applyToVectors(const LookTable& table, const RGBA8Pixel* from, RGBA8Pixel* to,
                           std::size_t count) {
  return count < PairsTable::leastPixels ? 0 : PairsTable::of(table).apply(from, to, count);
}
#else
std::size_t applyToVectors(const LookTable&, const RGBA8Pixel*, RGBA8Pixel*, std::size_t) {
  return 0;
}
#endif

HWY_INLINE RGBA8Pixel lookUp(const LookTable& table, const RGBA8Pixel& p) {
  return {table[0][p.r], table[1][p.g], table[2][p.b], p.a};
}

void applyLookTable(const LookTable& table, const RGBA8Pixel* from, RGBA8Pixel* to,
                    std::size_t count) {
  std::size_t i = applyToVectors(table, from, to, count);
  for (; i + pixelsInLine <= count; i += pixelsInLine) {
    prefetchAhead(from + i);
    prefetchAhead(to + i);
    for (std::size_t x = i; x < i + pixelsInLine; ++x) to[x] = lookUp(table, from[x]);
  }
  for (; i < count; ++i) to[i] = lookUp(table, from[i]);
}

void applyLookTables(const LookTable* tables, const VignetteRow& row, const RGBA8Pixel* from,
                     RGBA8Pixel* to, std::size_t count) {
  // Small loads wait long for the end of a store of 64 bytes.
  using Floats = hn::CappedTag<float, 8>;
  HWY_ALIGN std::int32_t samples[pixelsInLine];
  const VignetteRow copy = row;  // `to` might be anything the row refers to
  std::size_t i = 0;
  for (; i + pixelsInLine <= count; i += pixelsInLine) {
    prefetchAhead(from + i);
    prefetchAhead(to + i);
    for (std::size_t x = 0; x < pixelsInLine; x += hn::Lanes(Floats())) {
      hn::Store(simd::maskSamples(Floats(), copy, copy.uSquares + i + x),
                hn::RebindToSigned<Floats>(), samples + x);
    }
    for (std::size_t x = 0; x < pixelsInLine; ++x) {
      to[i + x] = lookUp(tables[samples[x]], from[i + x]);
    }
  }
  using OneFloat = hn::CappedTag<float, 1>;
  for (; i < count; ++i) {
    const auto sample = simd::maskSamples(OneFloat(), copy, copy.uSquares + i);
    to[i] = lookUp(tables[hn::GetLane(sample)], from[i]);
  }
}

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
namespace pelorin::image_processing {

HWY_EXPORT(applyLookTable);
void applyLookTable(const LookTable& table, const RGBA8Pixel* from, RGBA8Pixel* to,
                    std::size_t count) {
  HWY_DYNAMIC_DISPATCH(applyLookTable)(table, from, to, count);
}

HWY_EXPORT(applyLookTables);
void applyLookTables(const LookTable* tables, const VignetteRow& row, const RGBA8Pixel* from,
                     RGBA8Pixel* to, std::size_t count) {
  HWY_DYNAMIC_DISPATCH(applyLookTables)(tables, row, from, to, count);
}

}  // namespace pelorin::image_processing
#endif
