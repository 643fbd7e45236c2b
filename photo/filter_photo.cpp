#include "photo/filter_photo.h"

#include <algorithm>
#include <cmath>
#include <memory>
#include <stdexcept>

#include "image_processing/core/picture_rows.h"
#include "image_processing/filters/default_filter_factory.h"
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

/// The rows of a picture that are replaced by filtered ones. What is read is copied, since a filter
/// may ask for a row again that stands there filtered already.
class RowsInPlace : public RowSource, public RowSink {
 public:
  explicit RowsInPlace(const Image<RGBA8Pixel>& picture)
      : width_(picture.width), picture_(picture), filtered_(picture) {}

  const RGBA8Pixel* next(std::uint32_t count, RGBA8Pixel* room) override {
    std::copy_n(picture_.next(count, nullptr), std::size_t{width_} * count, room);
    return room;
  }
  void write(const RGBA8Pixel* rows, std::uint32_t count) override { filtered_.write(rows, count); }

 private:
  std::uint32_t width_;
  PictureSource picture_;
  PictureSink filtered_;
};

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
                   const std::vector<Face>& faces, int scale, const std::stop_token& stop) {
  const Image<RGBA8Pixel>& picture = *photo.image;
  const std::unique_ptr<RowFilter> rows =
      DefaultFilterFactory::filterFactory()->find(filter)->makeRowFilter(
          {.width = picture.width,
           .height = picture.height,
           .metadata =
               metadataWithFaces(allFaces(faces, photo), picture.width, picture.height, scale),
           .params = params});
  const RowWork work{.stop = [&] { return stop.stop_requested(); }};
  PictureSource whole(picture);
  if (rows->looksFirst() && !rows->look(whole, work)) throw Stopped();
  RowsInPlace inPlace(picture);
  if (!rows->filter(inPlace, inPlace, work)) throw Stopped();
}

std::vector<std::uint8_t> filterPhoto(std::span<const std::uint8_t> file,
                                      const FilterRequest& request, const Format* format,
                                      std::vector<Loss>* lost) {
  checkRequest(request);
  Photo photo = open(file, request.open);
  stopIfAsked(request.open.stop);
  filterInPlace(photo, request.filter, request.params, request.faces, request.open.scale,
                request.open.stop);
  if (format == nullptr) format = formatNamed(photo.facts.format);
  return save(*photo.image, *format, photo.metadata, request.save, lost);
}

}  // namespace pelorin::photo
