#include "photo/filter_photo.h"

#include <cmath>
#include <memory>
#include <stdexcept>

#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"
#include "image_processing/filters/parameter_check.h"

namespace pelorin::photo {

using namespace image_processing;

namespace {

[[noreturn]] void refuse(const std::string& message) {
  throw std::invalid_argument(message);
}

void checkRequest(const FilterRequest& request) {
  filterFor(request.filter, request.params);
  if (request.save.quality < 1 || request.save.quality > 100) {
    refuse("quality: is not from 1 to 100");
  }
  if (request.open.rotate % 90 != 0) refuse("rotation: is no multiple of 90");
  const int scale = request.open.scale;
  if (scale != 1 && scale != 2 && scale != 4 && scale != 8) refuse("scale: is not 1, 2, 4 or 8");
  requireFinite(request.faces);
}

}  // namespace

const FilterDescription& filterFor(const std::string& name, const std::string& params) {
  const FilterDescription* const filter = DefaultFilterFactory::filterFactory()->find(name);
  if (filter == nullptr) refuse("filter: there is no '" + name + "'");
  for (const ParameterFault& fault : checkParameters(*filter, params)) {
    using Kind = ParameterFault::Kind;
    if (fault.kind == Kind::unknown || fault.kind == Kind::missing ||
        fault.kind == Kind::unreadable)
      refuse("params: " + fault.message);
  }
  return *filter;
}

void requireFinite(const std::vector<Face>& faces) {
  for (const Face& face : faces) {
    for (const float side : {face.left, face.top, face.right, face.bottom})
      if (!std::isfinite(side)) refuse("faces: a side is not finite");
  }
}

void filterInPlace(Photo& photo, const std::string& filter, const std::string& params,
                   const std::vector<Face>& faces, int scale) {
  // The session ends here, before an encoder begins: its masks are several times the picture.
  FilteredImage session(
      photo.image,
      metadataWithFaces(allFaces(faces, photo), photo.image->width, photo.image->height, scale), "",
      defaultFilterConfigValue, DefaultFilterFactory::filterFactory());
  session.applyFilterWithParams(filter, params, defaultFilterConfigValue,
                                /*output=*/*photo.image);
}

std::vector<std::uint8_t> filterPhoto(std::span<const std::uint8_t> file,
                                      const FilterRequest& request, const Format* format,
                                      std::vector<Loss>* lost) {
  checkRequest(request);
  Photo photo = open(file, request.open);
  stopIfAsked(request.open.stop);
  filterInPlace(photo, request.filter, request.params, request.faces, request.open.scale);
  if (format == nullptr) format = formatNamed(photo.facts.format);
  return save(*photo.image, *format, photo.metadata, request.save, lost);
}

}  // namespace pelorin::photo
