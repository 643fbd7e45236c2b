#pragma once

#include <cstdint>
#include <vector>

#include "image_processing/core/image_metadata.h"
#include "photo/metadata/known_faces.h"

namespace pelorin::photo {

/// A face as a caller drew it: a box of which some part may lie outside the upright picture.
struct Face {
  float left, top, right, bottom;
  bool inPixels = false;  ///< Of the picture at its full size; fractions of it otherwise.
};

/// The caller's faces, then those that a photo's file knows of and that touch the picture.
std::vector<Face> allFaces(std::vector<Face> faces, const std::vector<KnownFace>& known);

/// The boxes in pixels of a picture of this size. Fractions are multiplied by it in float and
/// truncated, with no clamping, as the Java natives do it.
/// @param scale  how often smaller the picture was decoded than it is.
/// @throws PhotoError (invalidRequest) for a box in pixels that lies outside the picture.
image_processing::ImageMetadata metadataWithFaces(const std::vector<Face>& faces,
                                                  std::uint32_t width, std::uint32_t height,
                                                  int scale = 1);

}  // namespace pelorin::photo
