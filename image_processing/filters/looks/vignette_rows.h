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

/// The coordinates of a vignette, formed once for all columns and all rows: neither order is free,
/// since each comes of the one before it.
class VignetteRows {
 public:
  /// Whether the coordinates are numbers all over the picture. Infinite ones are fine; a step that
  /// is not finite makes them NaN, which the scalar definition deals with.
  static bool canCover(const VignetteCoordinates& coordinates) {
    return std::isfinite(coordinates.step);
  }

  /// @param mask  null where no row is asked for.
  /// @throws std::bad_alloc when a float a column and a row does not fit.
  VignetteRows(const VignetteCoordinates& coordinates, std::uint32_t width, std::uint32_t height,
               const CubicRadialMask* mask)
      : lastSample_(mask == nullptr ? 0.0f : static_cast<float>(mask->samples().size() - 1)),
        uSquares_(width),
        vs_(height) {
    float u = coordinates.firstU;
    for (float& square : uSquares_) {
      square = u * u;
      u += coordinates.step;
    }
    float v = coordinates.firstV;
    for (float& vertical : vs_) {
      vertical = v;
      v += coordinates.step;
    }
  }

  /// The vertical coordinate of row `y`.
  float v(std::uint32_t y) const { return vs_[y]; }

  /// Row `y`, where `canCover` holds; good until this is gone.
  VignetteRow row(std::uint32_t y) const {
    return {uSquares_.data(), vs_[y] * vs_[y], lastSample_};
  }

 private:
  float lastSample_;
  std::vector<float> uSquares_;
  std::vector<float> vs_;
};

}  // namespace pelorin::image_processing
