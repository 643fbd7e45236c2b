#pragma once

#include <cstdint>

namespace pelorin::photo {

/// How much work a file may ask for; checked before anything of the picture's size is allocated.
struct DecodeLimits {
  std::uint64_t pixels = 268'435'456;  ///< As the file stores them, before any scaling.
  int scans = 100;                     ///< Of progressive and other files of several scans.
  /// Pixels times scans of a file of several scans, beside 4096 for each of its bytes: no photo comes
  /// near, while a file of 71 kB may ask for 99 scans over 33 megapixels.
  std::uint64_t scannedPixels = 536'870'912;
};

}  // namespace pelorin::photo
