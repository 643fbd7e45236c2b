#pragma once

#include <initializer_list>
#include <memory>

#include "image_processing/core/image_metadata.h"

namespace pelorin::test_support {

/// What is known of a photo with these faces.
inline image_processing::ImageMetadata withFaces(
    std::initializer_list<image_processing::BoundingBox> boxes) {
  image_processing::ImageMetadata metadata;
  for (const auto& box : boxes) {
    metadata.faces.push_back(std::make_shared<image_processing::BoundingBox>(box));
  }
  return metadata;
}

}  // namespace pelorin::test_support
