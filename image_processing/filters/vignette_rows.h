#pragma once

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "image_processing/core/image.h"
#include "image_processing/filters/look.h"
#include "image_processing/filters/vignette_coordinates.h"

namespace pelorin::image_processing {

/// Which sample of its mask a vignette takes at each pixel, a row at a time: the squares of the
/// horizontal coordinates are formed once for all rows.
class VignetteRows {
 public:
  /// Whether the coordinates are numbers all over the picture. Infinite ones are fine; a step that
  /// is not finite makes them NaN, which the scalar definition deals with.
  static bool canCover(const VignetteCoordinates& coordinates) {
    return std::isfinite(coordinates.step);
  }

  /// Starts at row 0. `canCover` must hold.
  /// @throws std::bad_alloc when a float a column does not fit.
  VignetteRows(const VignetteCoordinates& coordinates, std::uint32_t width,
               const CubicRadialMask& mask)
      : step_(coordinates.step),
        v_(coordinates.firstV),
        lastSample_(static_cast<float>(mask.samples().size() - 1)),
        uSquares_(width) {
    float u = coordinates.firstU;
    for (float& square : uSquares_) {
      square = u * u;
      u += step_;
    }
  }

  void advanceToNextRow() { v_ += step_; }

  /// The sample indices of `count` pixels of the current row.
  void indices(std::size_t firstColumn, std::size_t count, std::int32_t* samples) const {
    const float vSquare = v_ * v_;
    const float* const uSquare = uSquares_.data() + firstColumn;
    for (std::size_t i = 0; i < count; ++i) {
      // The mask's domain is [0, 1], so its index is truncated from here.
      const float position = (uSquare[i] + vSquare) * lastSample_;
      samples[i] = static_cast<std::int32_t>(std::min(position, lastSample_));
    }
  }

 private:
  float step_;
  float v_;
  float lastSample_;
  std::vector<float> uSquares_;
};

}  // namespace pelorin::image_processing
