#pragma once

#include <memory>

#include "image_processing/core/image.h"

namespace pelorin::cli {

/// A mirroring from left to right (first, where there is one), then quarter turns clockwise.
struct Turn {
  bool mirrored = false;
  int quarters = 0;  ///< 0 ... 3

  friend bool operator==(const Turn&, const Turn&) = default;
};

/// The turn that shows a picture with this EXIF orientation upright; none for values that are not
/// 1 ... 8.
Turn uprightTurn(int orientation);

/// `first`, then `degrees` clockwise, a multiple of 90 of either sign.
Turn turnedFurther(Turn first, int degrees);

/// The turned picture in pixels of its own; `picture` itself when there is nothing to turn.
/// @throws std::bad_alloc when the second picture does not fit.
std::shared_ptr<image_processing::Image<image_processing::RGBA8Pixel>> turned(
    const std::shared_ptr<image_processing::Image<image_processing::RGBA8Pixel>>& picture,
    Turn turn);

}  // namespace pelorin::cli
