// How kernels for WebAssembly read tables, which is a lane at a time: included by those that do, for it alone.
// A stage leaves the addresses of entries in memory, which takes a vector no more operations than indices, and
// the next one loads lanes from there.
#pragma once

#include <hwy/highway.h>

#include <bit>
#include <cstdint>

namespace pelorin::image_processing::HWY_NAMESPACE {
namespace simd {
namespace hn = hwy::HWY_NAMESPACE;
using Floats = hn::CappedTag<float, 16>;
using Ints = hn::RebindToSigned<Floats>;
using F = hn::Vec<Floats>;

/// The addresses of the entries at `index`, a whole number below 2^20, in a table of `stride` floats an entry.
template <int stride = 1>
HWY_INLINE void findEntriesAtWhole(const float* table, F index, std::int32_t* addresses) {
  // In the sum with this number, the offset of an entry is the mantissa.
  constexpr float unit = 0x1p23f / (4 * stride);
  const auto bits = hn::BitCast(Ints(), hn::Add(index, hn::Set(Floats(), unit)));
  const auto start = reinterpret_cast<std::uintptr_t>(table) - std::bit_cast<std::uint32_t>(unit);
  hn::Store(hn::Add(bits, hn::Set(Ints(), static_cast<std::int32_t>(start))), Ints(), addresses);
}

/// Those at any index above -1, truncated.
template <int stride = 1>
HWY_INLINE void findEntries(const float* table, F index, std::int32_t* addresses) {
  findEntriesAtWhole<stride>(table, hn::Trunc(index), addresses);
}

/// The entries at four addresses, of which `step` are apart.
template <int step = 1>
HWY_INLINE F read(const std::int32_t* addresses) {
  const auto at = [=](int lane) { return reinterpret_cast<const void*>(addresses[step * lane]); };
  auto entries = wasm_v128_load32_zero(at(0));
  entries = wasm_v128_load32_lane(at(1), entries, 1);
  entries = wasm_v128_load32_lane(at(2), entries, 2);
  return F{wasm_v128_load32_lane(at(3), entries, 3)};
}

/// Entries and the floats after them.
struct Pairs {
  F first, second;
};
template <int step = 1>
HWY_INLINE Pairs readPairs(const std::int32_t* addresses) {
  const auto at = [=](int lane) { return reinterpret_cast<const void*>(addresses[step * lane]); };
  const auto low = wasm_v128_load64_lane(at(1), wasm_v128_load64_zero(at(0)), 1);
  const auto high = wasm_v128_load64_lane(at(3), wasm_v128_load64_zero(at(2)), 1);
  return {F{wasm_i32x4_shuffle(low, high, 0, 2, 4, 6)},
          F{wasm_i32x4_shuffle(low, high, 1, 3, 5, 7)}};
}

}  // namespace simd
}  // namespace pelorin::image_processing::HWY_NAMESPACE
