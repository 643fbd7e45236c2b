#pragma once

#include <cstdint>
#include <memory>
#include <vector>

#include "image_processing/core/image.h"

namespace pelorin::cli {

/// Makes a JPEG file of a picture that never exists as a whole: it arrives as bands, full width,
/// top to bottom. Keeps the compressed bytes only. Not to be shared between threads.
class JpegBandEncoder {
 public:
  static constexpr std::uint32_t largestSide = 65500;  ///< What JPEG files are read up to.

  /// @param quality  1 ... 100.
  /// @throws photo::PhotoError when a side is 0 or above `largestSide`, and std::bad_alloc.
  JpegBandEncoder(std::uint32_t width, std::uint32_t height, int quality);
  ~JpegBandEncoder();

  /// Adds the next rows; alpha is ignored. The band is `width` wide and no higher than what is
  /// still missing.
  /// @throws photo::PhotoError when the compressed bytes do not fit into memory.
  void add(const image_processing::Image<image_processing::RGBA8Pixel>& band);

  /// The whole file; called once, when all rows were added.
  /// @throws as `add`.
  std::vector<std::uint8_t> finish();

 private:
  struct State;
  std::unique_ptr<State> state_;
};

}  // namespace pelorin::cli
