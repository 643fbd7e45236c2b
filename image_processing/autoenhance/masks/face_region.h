#pragma once

#include <cstdint>
#include <optional>
#include <vector>

#include "image_processing/core/image_metadata.h"

namespace pelorin::image_processing {

/// The rows or the columns that a face reaches, first before last.
struct FaceSide {
  std::int64_t first, last;

  /// How much the face counts at each of them: most in the middle, 0 at both ends.
  /// @throws std::bad_alloc.
  std::vector<float> weights() const;
};

/// The part of a photo that a face changes: its box grown to twice its size about its centre and
/// cut to the photo.
struct FaceRegion {
  FaceSide rows, columns;
};

/// Nothing where the region has no width or height. Never throws.
std::optional<FaceRegion> faceRegion(const BoundingBox& face, std::uint32_t width,
                                     std::uint32_t height);

}  // namespace pelorin::image_processing
