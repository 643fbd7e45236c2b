#include "bindings/java/filter_photo.h"

#include <cmath>
#include <memory>
#include <stdexcept>

#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"
#include "image_processing/filters/parameter_check.h"
#include "photo/photo.h"

namespace pelorin::quenby {

using namespace image_processing;

namespace {

[[noreturn]] void refuse(const std::string& message) {
  throw std::invalid_argument(message);
}

void checkRequest(const FilterRequest& request, const FilterFactory& factory) {
  const FilterDescription* const filter = factory.find(request.filter);
  if (filter == nullptr) refuse("filter: there is no '" + request.filter + "'");
  for (const ParameterFault& fault : checkParameters(*filter, request.params)) {
    using Kind = ParameterFault::Kind;
    // What else the check finds, the filter takes in silence, and the command with a note.
    if (fault.kind == Kind::unknown || fault.kind == Kind::missing ||
        fault.kind == Kind::unreadable)
      refuse("params: " + fault.message);
  }
  if (request.quality < 1 || request.quality > 100) refuse("quality: is not from 1 to 100");
  if (request.rotation % 90 != 0) refuse("rotation: is no multiple of 90");
  const int scale = request.scale;
  if (scale != 1 && scale != 2 && scale != 4 && scale != 8) refuse("scale: is not 1, 2, 4 or 8");
  for (const FaceFractions& face : request.faces) {
    for (const float side : {face.left, face.top, face.right, face.bottom})
      if (!std::isfinite(side)) refuse("faces: a side is not finite");
  }
}

/// Those of the request, then those that the file knows of.
ImageMetadata metadataWithFaces(std::vector<FaceFractions> faces, const photo::Photo& photo) {
  for (const photo::KnownFace& face : photo.faces) {
    if (face.right <= 0 || face.bottom <= 0 || face.left >= 1 || face.top >= 1) continue;
    faces.push_back({static_cast<float>(face.left), static_cast<float>(face.top),
                     static_cast<float>(face.right), static_cast<float>(face.bottom)});
  }
  ImageMetadata metadata;
  for (const FaceFractions& face : faces) {
    const BoundingBox box = boxInPixels(face, static_cast<float>(photo.image->width),
                                        static_cast<float>(photo.image->height));
    metadata.faces.push_back(std::make_shared<BoundingBox>(box));
  }
  return metadata;
}

}  // namespace

std::vector<std::uint8_t> filterPhoto(std::span<const std::uint8_t> file,
                                      const FilterRequest& request) {
  const std::shared_ptr<FilterFactory> factory = DefaultFilterFactory::filterFactory();
  checkRequest(request, *factory);
  photo::Photo photo =
      photo::open(file, {.scale = request.scale, .rotate = request.rotation, .stop = request.stop});
  if (request.stop.stop_requested()) throw photo::Stopped();
  {
    // The session ends before the encoder begins: its masks are several times the picture.
    FilteredImage session(photo.image, metadataWithFaces(request.faces, photo), "",
                          defaultFilterConfigValue, factory);
    session.applyFilterWithParams(request.filter, request.params, defaultFilterConfigValue,
                                  /*output=*/*photo.image);
  }
  return photo::save(*photo.image, "JPEG", photo.metadata,
                     {.quality = request.quality, .stop = request.stop});
}

}  // namespace pelorin::quenby
