#pragma once

#include <cstdint>

namespace pelorin::photo {

/// How much work a file may ask for; checked before anything of the picture's size is allocated. Time
/// is limited by `TimeLimit`.
struct DecodeLimits {
  std::uint64_t bytes = std::uint64_t{1} << 30;  ///< Of the file.
  std::uint64_t pixels = 268'435'456;            ///< As the file stores them, before any scaling.
  int scans = 100;  ///< Of progressive and other files of several scans.
  /// Pixels times scans of a file of several scans, beside 4096 for each of its bytes: no photo comes
  /// near, while a file of 71 kB may ask for 99 scans over 33 megapixels.
  std::uint64_t scannedPixels = 536'870'912;
  /// Before a JPEG file's picture data; profiles of 16 MB and extended XMP of 64 MB take 1300 together.
  int segments = 4096;
  /// Pixels of a PNG or an arithmetic coded JPEG file, beside 128 for each of its bytes: 64 kB may else
  /// ask for all of `pixels`.
  std::uint64_t compressedPixels = 40'000'000;
};

}  // namespace pelorin::photo
