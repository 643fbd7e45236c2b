#pragma once

#include <cstddef>

namespace pelorin::image_processing {

/// Asks the system to back a large buffer with huge pages, so that its first writing interrupts
/// the program once in 2 MiB and not once in 4 KiB. To be called before anything is written;
/// small buffers, and systems that know no such request, are left as they are.
void preferHugePages(void* memory, std::size_t bytes) noexcept;

}  // namespace pelorin::image_processing
