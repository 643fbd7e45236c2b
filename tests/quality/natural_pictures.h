#pragma once

#include <cstdint>
#include <vector>

#include "image_processing/core/image.h"

namespace pelorin::test_support {

/// A grey picture as floats, for pictures that are made rather than taken.
struct GreyPlane {
  std::uint32_t width, height;
  std::vector<float> values;

  GreyPlane(std::uint32_t width, std::uint32_t height, float value)
      : width(width), height(height), values(std::size_t{width} * height, value) {}

  float& at(std::uint32_t x, std::uint32_t y) { return values[std::size_t{y} * width + x]; }
  float at(std::uint32_t x, std::uint32_t y) const { return values[std::size_t{y} * width + x]; }
};

/// Noise with the statistics of natural scenes: every octave has the same contrast.
GreyPlane naturalPlane(std::uint32_t width, std::uint32_t height, std::uint64_t seed);

/// Gaussian blur; the border's pixels repeat.
GreyPlane blurred(const GreyPlane& plane, float sigma);

/// Adds normal noise to each pixel.
GreyPlane noisy(GreyPlane plane, float deviation, std::uint64_t seed);

/// What strong JPEG compression does: the cosine transform of each block of 8 x 8, in steps that
/// start at `step` and grow with the frequency. Whole blocks only.
GreyPlane compressed(GreyPlane plane, float step);

/// Rounded and clamped to bytes, the same in every channel.
image_processing::Image<image_processing::RGBA8Pixel> toPicture(const GreyPlane& plane);

}  // namespace pelorin::test_support
