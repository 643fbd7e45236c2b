#include "photo/filter_photo.h"

#include <fmt/format.h>

#include <algorithm>
#include <cmath>
#include <memory>
#include <optional>
#include <stdexcept>
#include <utility>

#include "image_processing/core/parameter_strings.h"
#include "image_processing/core/picture_rows.h"
#include "image_processing/core/stages.h"
#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/parameter_check.h"
#include "photo/photo_writer.h"
#include "photo/turned_image.h"

namespace pelorin::photo {

using namespace image_processing;

namespace {

[[noreturn]] void refuse(const std::string& message) {
  throw std::invalid_argument(message);
}

// A number as one front end writes it is the same in another: 1, 1.0 and 1.0E0.
std::string shortest(const std::string& value) {
  const std::optional<double> number = wholeNumber(value);
  return number ? fmt::format("{}", *number) : value;
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

/// The rows of a reader; where there is a picture to keep them, they stand there afterwards.
class DecodedRows : public RowSource {
 public:
  DecodedRows(RowReader& reader, const Image<RGBA8Pixel>* kept) : reader_(reader), kept_(kept) {}

  const RGBA8Pixel* next(std::uint32_t count, RGBA8Pixel* room) override {
    RGBA8Pixel* const rows = kept_ != nullptr ? kept_->row(next_) : room;
    reader_.read(rows, count);
    next_ += count;
    return rows;
  }

 private:
  RowReader& reader_;
  const Image<RGBA8Pixel>* kept_;
  std::uint32_t next_ = 0;
};

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

FilteredPhoto filterPhoto(std::span<const std::uint8_t> file, const FilterRequest& request,
                          const Format* format, const FilterResources& resources) {
  checkRequest(request);
  const OpenOptions& open = request.open;
  std::unique_ptr<RowReader> reader = openRows(file, open);
  Photo photo{nullptr, reader->facts(), reader->metadata(), {}};
  if (open.upright)
    photo.metadata.turn = turnedFurther(uprightTurn(photo.facts.orientation), open.rotate);
  const PictureSize stored = reader->size(), size = turnedSize(stored, photo.metadata.turn);
  if (open.faces && !open.raw) photo.faces = knownFaces(photo.metadata, size);
  if (format == nullptr) format = formatNamed(photo.facts.format);

  const std::unique_ptr<RowFilter> rows =
      filterFor(request.filter, request.params)
          .makeRowFilter({.width = size.width,
                          .height = size.height,
                          .metadata = metadataWithFaces(allFaces(request.faces, photo), size.width,
                                                        size.height, open.scale),
                          .params = request.params});
  RowWork work{.stop = [&] { return open.stop.stop_requested(); }};
  if (tasksFor(resources.workers) > 1) {
    work.workers = resources.workers;
    work.bandHeight = sharedBandHeight(size.width, size.height);
  }
  const auto stopUnless = [](bool done) {
    if (!done) throw Stopped();
  };

  SparePixels none;
  SparePixels& spare = resources.spare != nullptr ? *resources.spare : none;
  const bool asksAlpha = format->keepsAlpha && photo.facts.hasAlpha;
  const bool isTurned = photo.metadata.turn != Turn{};
  const bool fits =
      std::uint64_t{size.width} * size.height <= resources.pixels / sizeof(RGBA8Pixel);
  if (isTurned || asksAlpha) {
    photo.image = readTurned(*reader, photo.metadata.turn, spare, work.workers);
  } else if (rows->looksFirst() && (fits || photo.facts.progressive)) {
    photo.image = spare.picture(size.width, size.height);
  }
  if (rows->looksFirst()) {
    if (isTurned || asksAlpha) {
      PictureSource picture(*photo.image);
      stopUnless(rows->look(picture, work));
    } else {
      DecodedRows decoded(*reader, photo.image.get());
      stopUnless(rows->look(decoded, work));
      reader = photo.image == nullptr ? openRows(file, open) : nullptr;
    }
  }

  const bool hasAlpha = asksAlpha && !isOpaque(photo.image->data.get(), photo.image->pixelCount());
  SaveOptions save = request.save;
  if (request.mark && !save.mark) save.mark = markOf(request.filter, request.params);
  PhotoWriter writer(size, *format, hasAlpha, photo.metadata, save);
  WrittenRows written(writer);
  if (photo.image != nullptr) {
    PictureSource picture(*photo.image);
    stopUnless(rows->filter(picture, written, work));
    spare.keep(*photo.image);
    photo.image = nullptr;
  } else {
    DecodedRows decoded(*reader, nullptr);
    stopUnless(rows->filter(decoded, written, work));
  }
  FilteredPhoto filtered{{}, size, std::move(photo.facts)};
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
