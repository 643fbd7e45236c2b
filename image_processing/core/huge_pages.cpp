#include "image_processing/core/huge_pages.h"

#include <cstdint>

#ifdef __linux__
#include <sys/mman.h>
#endif

namespace pelorin::image_processing {

void preferHugePages([[maybe_unused]] void* memory, [[maybe_unused]] std::size_t bytes) noexcept {
#ifdef MADV_HUGEPAGE
  // Only the whole huge pages inside: the rest may be shared with other buffers.
  constexpr std::uintptr_t hugePage = 2 << 20;
  const auto begin = reinterpret_cast<std::uintptr_t>(memory);
  const std::uintptr_t first = (begin + hugePage - 1) / hugePage * hugePage;
  const std::uintptr_t last = (begin + bytes) / hugePage * hugePage;
  // A refusal changes nothing but the speed.
  if (first < last) madvise(reinterpret_cast<void*>(first), last - first, MADV_HUGEPAGE);
#endif
}

}  // namespace pelorin::image_processing
