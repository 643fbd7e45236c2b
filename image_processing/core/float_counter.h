#pragma once

#include <algorithm>
#include <cstdint>

namespace pelorin::image_processing {

/// What a float holds that has counted to `count` by ones: adding 1 to 2^24 gives 2^24. Counting in
/// integers and asking here is the same, and faster.
inline float asFloatCounter(std::uint64_t count) {
  return static_cast<float>(std::min<std::uint64_t>(count, std::uint64_t{1} << 24));
}

}  // namespace pelorin::image_processing
