#pragma once

#include <cstdint>
#include <stdexcept>

#include "image_processing/core/image.h"

namespace pelorin::image_processing {

/// @throws std::invalid_argument with `what` unless `condition`.
inline void require(bool condition, const char* what) {
  if (!condition) throw std::invalid_argument(what);
}

/// Whether an image has room for a picture of this size in its top left.
template <typename T>
bool holds(const Image<T>& image, std::uint64_t width, std::uint64_t height) {
  return image.width >= width && image.height >= height;
}

}  // namespace pelorin::image_processing
