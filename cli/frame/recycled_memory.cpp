#include "cli/frame/recycled_memory.h"

#include <cstdlib>

#ifdef __GLIBC__
#include <malloc.h>
#endif

namespace pelorin::cli {

void recycleFreedMemory() {
#ifdef __GLIBC__
  constexpr int never = -1, none = 0;
  mallopt(M_TRIM_THRESHOLD, never);
  mallopt(M_MMAP_MAX, none);  // large buffers live in the heap, too
  mallopt(M_ARENA_MAX, 1);    // the heap, which alone can hold them
#endif
}

}  // namespace pelorin::cli
