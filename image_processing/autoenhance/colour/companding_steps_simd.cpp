#include "image_processing/autoenhance/colour/companding_steps.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/autoenhance/colour/companding_steps_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include <array>
#include <bit>

#include "image_processing/autoenhance/colour/srgb.h"
#include "image_processing/core/prefetch.h"
#include "image_processing/core/simd.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
namespace hn = hwy::HWY_NAMESPACE;
using Floats = hn::CappedTag<float, 16>;
using Ints = hn::RebindToSigned<Floats>;
using Words = hn::RebindToUnsigned<Floats>;
constexpr std::size_t lanes = hn::MaxLanes(Floats());

/// Linear light times its share of Y, by code: the product of a table entry and a constant is the
/// same float whenever it is formed.
struct Shares {
  float red[256], green[256], blue[256];

  Shares() {
    for (int code = 0; code < 256; ++code) {
      red[code] = yOfRgb.first * sRGBToLinearTable[code];
      green[code] = yOfRgb.second * sRGBToLinearTable[code];
      blue[code] = yOfRgb.third * sRGBToLinearTable[code];
    }
  }
};

HWY_INLINE void storeSteps(hn::Vec<Floats> red, hn::Vec<Floats> green, hn::Vec<Floats> blue,
                           std::uint16_t* steps) {
  const hn::Rebind<std::uint16_t, Floats> halves;
  const auto most = hn::Set(Floats(), static_cast<float>(compandingStepCount - 1));
  const auto luminance = hn::Add(hn::Add(red, green), blue);
  const auto step = simd::truncate(hn::Min(hn::Mul(luminance, most), most));
  hn::StoreU(hn::DemoteTo(halves, step), halves, steps);
}

#if HWY_TARGET <= HWY_AVX3_DL
/// The shares of one channel as bytes in registers, read by permutes: 256 floats are four tables of
/// 256 bytes, one for each byte of a float.
class ByteTables {
 public:
  explicit ByteTables(const float* shares) {
    for (std::size_t code = 0; code < 256; ++code) {
      const auto bits = std::bit_cast<std::array<std::uint8_t, 4>>(shares[code]);
      for (std::size_t i = 0; i < 4; ++i) bytes_[i][code] = bits[i];
    }
  }

  /// The shares of 64 codes: vector j has those of bytes 4 j to 4 j + 3 of each 16 codes.
  HWY_INLINE void read(__m512i codes, hn::Vec<Floats>* shares) const {
    const __mmask64 upperHalf = _mm512_movepi8_mask(codes);
    const auto byte = [&](std::size_t i) HWY_ATTR {
      const auto half = [&](std::size_t first) HWY_ATTR {
        return _mm512_permutex2var_epi8(_mm512_load_si512(bytes_[i] + first), codes,
                                        _mm512_load_si512(bytes_[i] + first + 64));
      };
      return _mm512_mask_blend_epi8(upperHalf, half(0), half(128));
    };
    const __m512i byte0 = byte(0), byte1 = byte(1), byte2 = byte(2), byte3 = byte(3);
    const __m512i low01 = _mm512_unpacklo_epi8(byte0, byte1);
    const __m512i high01 = _mm512_unpackhi_epi8(byte0, byte1);
    const __m512i low23 = _mm512_unpacklo_epi8(byte2, byte3);
    const __m512i high23 = _mm512_unpackhi_epi8(byte2, byte3);
    const auto floats = [](__m512i bits)
                            HWY_ATTR { return hn::Vec<Floats>{_mm512_castsi512_ps(bits)}; };
    shares[0] = floats(_mm512_unpacklo_epi16(low01, low23));
    shares[1] = floats(_mm512_unpackhi_epi16(low01, low23));
    shares[2] = floats(_mm512_unpacklo_epi16(high01, high23));
    shares[3] = floats(_mm512_unpackhi_epi16(high01, high23));
  }

 private:
  alignas(64) std::uint8_t bytes_[4][256];
};

struct ShareTables {
  Shares shares;
  ByteTables channels[3] = {ByteTables(shares.red), ByteTables(shares.green),
                            ByteTables(shares.blue)};
  /// Where, in two vectors of pixels, each channel's codes are, in the order that `read` undoes.
  alignas(64) std::uint8_t places[3][64];

  ShareTables() {
    for (int channel = 0; channel < 3; ++channel) {
      for (int at = 0; at < 64; ++at) {
        const int sixteen = at / 16, vector = at / 4 % 2, pixel = 4 * sixteen + at % 4;
        places[channel][at] = static_cast<std::uint8_t>(64 * vector + 4 * pixel + channel);
      }
    }
  }
};

/// Whole groups of 64 pixels. @returns how many pixels they are.
std::size_t permutedSteps(const RGBA8Pixel* pixels, std::uint16_t* steps, std::size_t count) {
  static const ShareTables tables;
  std::size_t i = 0;
  for (; i + 64 <= count; i += 64) {
    __m512i p[4];
    for (std::size_t j = 0; j < 4; ++j) {
      p[j] = _mm512_loadu_si512(pixels + i + 16 * j);
      prefetchAhead(pixels + i + 16 * j);
    }
    hn::Vec<Floats> shares[3][4];
    for (std::size_t channel = 0; channel < 3; ++channel) {
      const __m512i places = _mm512_load_si512(tables.places[channel]);
      const __m512i codes =
          _mm512_mask_blend_epi32(0b1100110011001100, _mm512_permutex2var_epi8(p[0], places, p[1]),
                                  _mm512_permutex2var_epi8(p[2], places, p[3]));
      tables.channels[channel].read(codes, shares[channel]);
    }
    for (std::size_t j = 0; j < 4; ++j) {
      storeSteps(shares[0][j], shares[1][j], shares[2][j], steps + i + 16 * j);
    }
  }
  return i;
}
#else
std::size_t permutedSteps(const RGBA8Pixel*, std::uint16_t*, std::size_t) {
  return 0;
}
#endif

void compandingSteps(const RGBA8Pixel* pixels, std::uint16_t* steps, std::size_t count) {
  static const Shares shares;
  const auto byte = hn::Set(Words(), 0xFFu);
  std::size_t i = permutedSteps(pixels, steps, count);
  for (; i + lanes <= count; i += lanes) {
    // Rows are read with other work between them, and so are always cold.
    if (i % 16 == 0) prefetchAhead(pixels + i);
    // Red in the low byte: every target is little-endian.
    const auto p = hn::LoadU(Words(), reinterpret_cast<const std::uint32_t*>(pixels + i));
    const auto share = [&](const float* table, auto word) HWY_ATTR {
      return hn::GatherIndex(Floats(), table, hn::BitCast(Ints(), hn::And(word, byte)));
    };
    const auto red = share(shares.red, p);
    const auto green = share(shares.green, hn::ShiftRight<8>(p));
    const auto blue = share(shares.blue, hn::ShiftRight<16>(p));
    storeSteps(red, green, blue, steps + i);
  }
  compandingStepsScalar(pixels + i, steps + i, count - i);
}

void unitLightness(const std::uint16_t* steps, float* lightness, std::size_t count) {
  const float* const ofSteps = unitLightnessOfSteps().data();
  const hn::Rebind<std::uint16_t, Floats> halves;
  std::size_t i = 0;
  for (; i + lanes <= count; i += lanes) {
    const auto step = hn::PromoteTo(Ints(), hn::LoadU(halves, steps + i));
    hn::StoreU(hn::GatherIndex(Floats(), ofSteps, step), Floats(), lightness + i);
  }
  for (; i < count; ++i) lightness[i] = ofSteps[steps[i]];
}

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
namespace pelorin::image_processing {
HWY_EXPORT(compandingSteps);
void compandingSteps(const RGBA8Pixel* pixels, std::uint16_t* steps, std::size_t count) {
  HWY_DYNAMIC_DISPATCH(compandingSteps)(pixels, steps, count);
}

HWY_EXPORT(unitLightness);
void unitLightness(const std::uint16_t* steps, float* lightness, std::size_t count) {
  HWY_DYNAMIC_DISPATCH(unitLightness)(steps, lightness, count);
}
}  // namespace pelorin::image_processing
#endif
