#include "photo/faces.h"

#include <memory>

#include "image_processing/core/face_fractions.h"
#include "image_processing/core/number_text.h"
#include "photo/photo_error.h"

namespace pelorin::photo {
namespace {

using image_processing::BoundingBox;

BoundingBox boxOf(const Face& face, std::uint32_t width, std::uint32_t height, int scale) {
  // A division by a power of two is exact.
  const float divisor = static_cast<float>(scale);
  const float columns = face.inPixels ? 1.0f / divisor : static_cast<float>(width);
  const float rows = face.inPixels ? 1.0f / divisor : static_cast<float>(height);
  return image_processing::boxInPixels({face.left, face.top, face.right, face.bottom}, columns,
                                       rows);
}

}  // namespace

std::vector<Face> allFaces(std::vector<Face> faces, const std::vector<KnownFace>& known) {
  for (const KnownFace& face : known) {
    if (face.right <= 0 || face.bottom <= 0 || face.left >= 1 || face.top >= 1) continue;
    faces.push_back({static_cast<float>(face.left), static_cast<float>(face.top),
                     static_cast<float>(face.right), static_cast<float>(face.bottom)});
  }
  return faces;
}

image_processing::ImageMetadata metadataWithFaces(const std::vector<Face>& faces,
                                                  std::uint32_t width, std::uint32_t height,
                                                  int scale) {
  image_processing::ImageMetadata metadata;
  for (const Face& face : faces) {
    const BoundingBox box = boxOf(face, width, height, scale);
    if (face.inPixels && (box.left >= static_cast<std::int64_t>(width) ||
                          box.top >= static_cast<std::int64_t>(height))) {
      using image_processing::roundedText;
      throw PhotoError(PhotoError::Kind::invalidRequest,
                       "the face " + roundedText(face.left, 7) + "," + roundedText(face.top, 7) +
                           "," + roundedText(face.right, 7) + "," + roundedText(face.bottom, 7) +
                           " lies outside the picture");
    }
    metadata.faces.push_back(std::make_shared<BoundingBox>(box));
  }
  return metadata;
}

}  // namespace pelorin::photo
