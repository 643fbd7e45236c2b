#pragma once

#include <cstddef>
#include <cstdint>

namespace pelorin::image_processing {

/// Bytes of a cache line on most processors.
constexpr std::size_t cacheLine = 64;

/// Asks for the cache line that a loop reads or writes 2 KiB after `place`. Helps loops whose many
/// small stores would fill the store buffer while a line is on its way. May lie outside of any
/// array: a hint never faults.
inline void prefetchAhead(const void* place) {
  constexpr std::uintptr_t distance = 2048;
  __builtin_prefetch(
      reinterpret_cast<const void*>(reinterpret_cast<std::uintptr_t>(place) + distance));
}

}  // namespace pelorin::image_processing
