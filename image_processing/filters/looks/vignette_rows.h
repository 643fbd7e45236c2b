#pragma once

#include <cmath>
#include <cstdint>
#include <vector>

#include "image_processing/filters/looks/look.h"
#include "image_processing/filters/looks/vignette_coordinates.h"

namespace pelorin::image_processing {

/// The coordinates of a vignette along one row of the picture.
struct VignetteRow {
  const float* uSquares;  ///< Squared horizontal coordinates, one a column.
  float vSquare;          ///< The squared vertical coordinate.
  float lastSample;       ///< Index of the mask's last sample.
};

/// The coordinates of a vignette row by row: the squares of the horizontal ones are formed once for
/// all rows.
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

  void advance() { v_ += step_; }

  /// The current row; good until this is gone.
  VignetteRow row() const { return {uSquares_.data(), v_ * v_, lastSample_}; }

 private:
  float step_;
  float v_;
  float lastSample_;
  std::vector<float> uSquares_;
};

}  // namespace pelorin::image_processing
