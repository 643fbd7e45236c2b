#include "image_processing/features/brief_bits.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/features/brief_bits_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include <bit>
#include <cstring>

static_assert(std::endian::native == std::endian::little, "mask bytes are read as words");

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
namespace hn = hwy::HWY_NAMESPACE;

using Bytes = hn::CappedTag<std::uint8_t, 64>;  // a mask of them fits into a word

void briefBits(const std::uint8_t* center, const BriefOffsets& offsets, std::uint32_t* words) {
  // Plain loads fetch single bytes faster than gathers of wider elements do. Four at a time, since
  // counting takes as long as loading.
  alignas(64) std::uint8_t pixels[512];
  for (std::size_t i = 0; i < offsets.size(); i += 4) {
    pixels[i] = center[offsets[i]];
    pixels[i + 1] = center[offsets[i + 1]];
    pixels[i + 2] = center[offsets[i + 2]];
    pixels[i + 3] = center[offsets[i + 3]];
  }

  const Bytes bytes;
  for (std::size_t i = 0; i < 256; i += 64) {
    std::uint64_t bits = 0;
    for (std::size_t lane = 0; lane < 64; lane += hn::Lanes(bytes)) {
      const auto first = hn::Load(bytes, pixels + i + lane);
      const auto second = hn::Load(bytes, pixels + 256 + i + lane);
      std::uint64_t mask = 0;
      hn::StoreMaskBits(bytes, hn::Lt(first, second), reinterpret_cast<std::uint8_t*>(&mask));
      bits |= mask << lane;
    }
    std::memcpy(words + i / 32, &bits, sizeof bits);
  }
}

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();
#if HWY_ONCE
namespace pelorin::image_processing {

HWY_EXPORT(briefBits);
std::array<std::uint32_t, 8> briefBits(const std::uint8_t* center, const BriefOffsets& offsets) {
  std::array<std::uint32_t, 8> words;
  HWY_DYNAMIC_DISPATCH(briefBits)(center, offsets, words.data());
  return words;
}

}  // namespace pelorin::image_processing
#endif
