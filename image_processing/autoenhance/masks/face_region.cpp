#include "image_processing/autoenhance/masks/face_region.h"

#include <algorithm>

#include "image_processing/autoenhance/masks/shaping_tables.h"

namespace pelorin::image_processing {
namespace {

/// From one side length before the centre of [low, high] to one after it, within [0, size - 1].
FaceSide grown(std::int64_t low, std::int64_t high, std::int64_t size) {
  const std::int64_t centre = (low + high) / 2;
  const std::int64_t length = high - low;
  return {std::clamp<std::int64_t>(centre - length, 0, size - 1),
          std::clamp<std::int64_t>(centre + length, 0, size - 1)};
}

}  // namespace

std::vector<float> FaceSide::weights() const {
  const SuperQuadric window(static_cast<float>(first), static_cast<float>(last), 1024, 2.0f);
  std::vector<float> weights;
  weights.reserve(static_cast<std::size_t>(last - first + 1));
  for (std::int64_t at = first; at <= last; ++at) {
    weights.push_back(window(static_cast<float>(at)));
  }
  return weights;
}

std::optional<FaceRegion> faceRegion(const BoundingBox& face, std::uint32_t width,
                                     std::uint32_t height) {
  if (width == 0 || height == 0) return std::nullopt;
  const FaceRegion region = {grown(face.top, face.bottom, height),
                             grown(face.left, face.right, width)};
  if (region.rows.first >= region.rows.last || region.columns.first >= region.columns.last) {
    return std::nullopt;
  }
  return region;
}

}  // namespace pelorin::image_processing
