#pragma once

#include <cstdint>
#include <memory>
#include <vector>

namespace pelorin::image_processing {

/// A face in pixels of the session's image, all four bounds inclusive, y growing downwards. Boxes
/// are used as they come: they may lie outside the image, and a reversed one holds no pixel.
struct BoundingBox {
  std::int32_t left, right, bottom, top;

  bool contains(std::int64_t x, std::int64_t y) const {
    return left <= x && x <= right && top <= y && y <= bottom;
  }
};

/// What is known of an image beside its pixels. Copies share the boxes.
struct ImageMetadata {
  std::vector<std::shared_ptr<BoundingBox>> faces;  ///< In the order they were supplied.
};

}  // namespace pelorin::image_processing
