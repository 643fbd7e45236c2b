#pragma once

#include <cstdint>
#include <vector>

#include "image_processing/core/image.h"

namespace pelorin::test_support {

using image_processing::Image;
using image_processing::RGBA8Pixel;

/// A small generator with the same numbers on every platform and standard library (xorshift64*).
class Random {
 public:
  explicit Random(std::uint64_t seed) : state_(seed * 0x9E3779B97F4A7C15u + 0x632BE59BD9B4E019u) {}

  std::uint32_t next32();
  /// In [0, 1), all of the float's 24 bits.
  float nextFloat();
  /// In [0, bound); `bound` above 0.
  std::uint32_t below(std::uint32_t bound);

 private:
  std::uint64_t state_;
};

/// `count` pixels of noise, alpha included.
std::vector<RGBA8Pixel> randomPixels(std::size_t count, std::uint64_t seed);

/// Noise in every channel, alpha included.
Image<RGBA8Pixel> noisePicture(std::uint32_t width, std::uint32_t height, std::uint64_t seed);

/// Every pixel the same.
Image<RGBA8Pixel> flatPicture(std::uint32_t width, std::uint32_t height, RGBA8Pixel pixel);

/// What a photo is to the engine: smooth shading, edges, skin-coloured and saturated areas, dark
/// and blown parts, texture and a little noise. Made with integer arithmetic alone, so that every
/// platform sees the same picture. Alpha varies from column to column.
Image<RGBA8Pixel> photoLikePicture(std::uint32_t width, std::uint32_t height, std::uint64_t seed);

}  // namespace pelorin::test_support
