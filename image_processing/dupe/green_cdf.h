#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "image_processing/core/image.h"

namespace pelorin::image_processing {

/// Cumulative distribution of a photo's green channel: entry i is the share of pixels whose green
/// byte is at most i. Never decreases and ends at 1 up to rounding; all 0 for an empty image.
using GreenCDF = std::array<float, 256>;

/// The distribution of the green bytes of `image`. Counts are those of float counters, which stop
/// at 2^24: a larger image's distribution is distorted and may end above 1. Never throws and keeps
/// no state, so any thread may call it.
void computeGreenCDF(const Image<RGBA8Pixel>& image, GreenCDF& cdf);

/// Counts the green bytes of a picture that comes piece by piece: of all of them together it has the
/// distribution that `computeGreenCDF` has. For one thread; never throws.
class GreenCounter {
 public:
  void add(const RGBA8Pixel* pixels, std::size_t count);
  GreenCDF cdf() const;

 private:
  std::array<std::uint64_t, 256> counts_{};
  std::uint64_t pixels_ = 0;
};

/// The definition of `computeGreenCDF`, counted in float.
void computeGreenCDFScalar(const Image<RGBA8Pixel>& image, GreenCDF& cdf);

/// The distribution of a histogram over `pixelCount` pixels, both as float counters hold them.
void computeCDFFromCounts(const std::array<float, 256>& histogram, float pixelCount, GreenCDF& cdf);

}  // namespace pelorin::image_processing
