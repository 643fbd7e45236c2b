#pragma once

#include <cstdint>

namespace pelorin::photo {

/// How much work a file may ask for; checked before anything of the picture's size is allocated.
struct DecodeLimits {
  std::uint64_t pixels = 268'435'456;  ///< As the file stores them, before any scaling.
  int scans = 100;                     ///< Of progressive and other files of several scans.
};

}  // namespace pelorin::photo
