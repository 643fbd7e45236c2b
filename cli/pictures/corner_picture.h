#pragma once

#include <string>
#include <vector>

#include "cli/pictures/annotated_photo.h"

namespace pelorin::cli {

/// A pixel to mark, and what its colour says.
struct MarkedPixel {
  int x, y;
  float value;  ///< Finite.
};

/// The photo with a ring around each pixel, coloured by its value; higher ones lie on top.
/// @param label  what the colours stand for.
/// @throws std::bad_alloc when the picture does not fit into memory.
AnnotatedPhoto::Photo drawCorners(const ShownPhoto& photo, std::vector<MarkedPixel> pixels,
                                  const std::string& title, const std::string& subtitle,
                                  const std::string& label);

}  // namespace pelorin::cli
