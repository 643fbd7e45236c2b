#include "photo/filter_photo.h"

#include <algorithm>
#include <cmath>
#include <memory>
#include <optional>
#include <stdexcept>
#include <utility>

#include "image_processing/core/number_text.h"
#include "image_processing/core/parameter_strings.h"
#include "image_processing/core/stages.h"
#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/parameter_check.h"
#include "photo/photo_rows.h"
#include "photo/photo_writer.h"

namespace pelorin::photo {

using namespace image_processing;

namespace {

[[noreturn]] void refuse(const std::string& message) {
  throw std::invalid_argument(message);
}

// A number as one front end writes it is the same in another: 1, 1.0 and 1.0E0.
std::string shortest(const std::string& value) {
  const std::optional<double> number = wholeNumber(value);
  return number ? shortestText(*number) : value;
}

void checkRequest(const FilterRequest& request) {
  filterFor(request.filter, request.params);
  const int quality = request.save.quality;
  if (quality != sourceQuality && (quality < 1 || quality > 100)) {
    refuse("quality: is not from 1 to 100");
  }
  if (request.open.rotate % 90 != 0) refuse("rotation: is no multiple of 90");
  const int scale = request.open.scale;
  if (scale != 1 && scale != 2 && scale != 4 && scale != 8) refuse("scale: is not 1, 2, 4 or 8");
  requireFinite(request.faces);
}

class WrittenRows : public RowSink {
 public:
  explicit WrittenRows(PhotoWriter& writer) : writer_(writer) {}
  void write(const RGBA8Pixel* rows, std::uint32_t count) override { writer_.write(rows, count); }

 private:
  PhotoWriter& writer_;
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

FilteredPhoto filterPhoto(const FileView& file, const FilterRequest& request, const Format* format,
                          const RowResources& resources) {
  checkRequest(request);
  const OpenOptions& open = request.open;
  PhotoRows photo(file, open, resources);
  const PictureSize size = photo.size();
  if (format == nullptr) format = formatNamed(photo.facts().format);

  const std::unique_ptr<RowFilter> filter =
      filterFor(request.filter, request.params)
          .makeRowFilter({.width = size.width,
                          .height = size.height,
                          .metadata = metadataWithFaces(allFaces(request.faces, photo.faces()),
                                                        size.width, size.height, open.scale),
                          .params = request.params});
  RowWork work{.stop = [&] { return open.stop.stop_requested(); }};
  if (tasksFor(resources.workers) > 1) {
    work.workers = resources.workers;
    work.bandHeight = sharedBandHeight(size.width, size.height);
  }
  if (resources.bandHeight > 0) work.bandHeight = resources.bandHeight;
  const auto stopUnless = [](bool done) {
    if (!done) throw Stopped();
  };

  // Filters copy it.
  const auto isTransparent = [&] {
    const Image<RGBA8Pixel>& picture = photo.picture();
    return !isOpaque(picture.data.get(), picture.pixelCount());
  };
  const bool hasAlpha = photo.facts().hasAlpha && (!format->keepsAlpha || isTransparent());
  if (filter->looksFirst()) stopUnless(filter->look(photo.sweep(/*again=*/true), work));

  SaveOptions save = request.save;
  if (request.mark && !save.mark) save.mark = markOf(request.filter, request.params);
  PhotoWriter writer(size, *format, hasAlpha, photo.metadata(), save);
  WrittenRows written(writer);
  stopUnless(filter->filter(photo.sweep(/*again=*/false), written, work));
  FilteredPhoto filtered{{}, size, photo.facts()};
  filtered.file = writer.finish(&filtered.lost);
  return filtered;
}

EditMark markOf(const std::string& filter, const std::string& params) {
  EditMark mark = {PELORIN_VERSION, filter, ""};
  const FilterParams given(params);
  for (const auto& [key, value] : given.items()) {
    if (!mark.params.empty()) mark.params += ';';
    mark.params += key + "=" + shortest(value);
  }
  // XMP holds no others.
  const auto isText = [](char letter) { return letter >= ' ' && letter <= '~'; };
  std::replace_if(
      mark.params.begin(), mark.params.end(), [&](char letter) { return !isText(letter); }, '?');
  return mark;
}

const EditMark* earlierEdit(const PhotoFacts& facts, const FilterDescription& filter) {
  const auto factory = DefaultFilterFactory::filterFactory();
  const auto found = std::find_if(facts.edits.rbegin(), facts.edits.rend(), [&](const EditMark& e) {
    if (e.filter == filter.name) return true;
    const FilterDescription* const other = factory->find(e.filter);
    return other != nullptr && other->displayName == filter.displayName;
  });
  return found == facts.edits.rend() ? nullptr : &*found;
}

}  // namespace pelorin::photo
