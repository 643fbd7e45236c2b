#pragma once

#include <cstddef>
#include <cstdint>
#include <limits>
#include <new>

namespace pelorin::image_processing {

/// Product of sizes that is safe to allocate and to index with.
/// @throws std::bad_alloc when the product does not fit the address space.
template <typename... Sizes>
std::size_t checkedProduct(std::uint64_t first, Sizes... others) {
  constexpr std::uint64_t largest = std::numeric_limits<std::ptrdiff_t>::max();
  std::uint64_t product = first;
  bool fits = true;
  ((fits = fits && !__builtin_mul_overflow(product, std::uint64_t{others}, &product)), ...);
  if (!fits || product > largest) throw std::bad_alloc();
  return static_cast<std::size_t>(product);
}

}  // namespace pelorin::image_processing
