#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "image_processing/autoenhance/colour/companding_steps.h"
#include "image_processing/core/pixel_types.h"

namespace pelorin::image_processing {

/// L / 100 of a photo's pixels, found a row at a time: cheaper than a plane of it would be to keep.
/// For one thread.
class LightnessRow {
 public:
  /// @throws std::bad_alloc.
  explicit LightnessRow(std::size_t width) : steps_(width), lightness_(width) {}

  /// Of one row; good until the next is asked for. Never throws.
  const float* of(const RGBA8Pixel* pixels) {
    compandingSteps(pixels, steps_.data(), steps_.size());
    unitLightness(steps_.data(), lightness_.data(), steps_.size());
    return lightness_.data();
  }

 private:
  std::vector<std::uint16_t> steps_;
  std::vector<float> lightness_;
};

}  // namespace pelorin::image_processing
