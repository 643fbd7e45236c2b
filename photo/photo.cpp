#include "photo/photo.h"

#include <algorithm>
#include <bit>
#include <utility>

#include "photo/reduced_rows.h"
#include "photo/turned_image.h"

namespace pelorin::photo {

using image_processing::Image;
using image_processing::RGBA8Pixel;

namespace {

// As decoders that scale take it.
std::uint32_t divisorOf(int scale) {
  return std::min(8u, std::bit_floor(static_cast<unsigned>(std::max(1, scale))));
}

std::unique_ptr<RowReader> readerOf(std::span<const std::uint8_t> file,
                                    const OpenOptions& options) {
  const Format& format = options.raw ? rawPixels() : formatOf(file);
  std::unique_ptr<RowReader> reader = format.reader(file, options);
  const std::uint32_t divisor = divisorOf(options.scale);
  if (divisor == 1 || format.scalesWhileDecoding) return reader;
  return reducedRows(std::move(reader), divisor);
}

bool hasAlpha(const Image<RGBA8Pixel>& picture) {
  const RGBA8Pixel* first = picture.data.get();
  return std::any_of(first, first + picture.pixelCount(),
                     [](const RGBA8Pixel& pixel) { return pixel.a != 255; });
}

}  // namespace

void stopIfAsked(const std::stop_token& stop) {
  if (stop.stop_requested()) throw Stopped();
}

std::unique_ptr<RowReader> openRows(std::span<const std::uint8_t> file,
                                    const OpenOptions& options) {
  stopIfAsked(options.stop);
  return readerOf(file, options);
}

PhotoFacts readFacts(std::span<const std::uint8_t> file) {
  return readerOf(file, {})->facts();
}

Photo open(std::span<const std::uint8_t> file, const OpenOptions& options, SparePixels* spare) {
  const std::unique_ptr<RowReader> rows = openRows(file, options);
  Photo photo{nullptr, rows->facts(), rows->metadata(), {}};
  SparePixels none;
  const PictureSize size = rows->size();
  photo.image = (spare != nullptr ? spare : &none)->picture(size.width, size.height);
  rows->read(photo.image->data.get(), size.height);
  stopIfAsked(options.stop);
  if (options.upright) {
    photo.metadata.turn = turnedFurther(uprightTurn(photo.facts.orientation), options.rotate);
    photo.image = turned(photo.image, photo.metadata.turn);
  }
  if (options.faces && !options.raw)
    photo.faces = knownFaces(photo.metadata, {photo.image->width, photo.image->height});
  return photo;
}

std::vector<std::uint8_t> save(const Image<RGBA8Pixel>& picture, const Format& format,
                               const Metadata& metadata, const SaveOptions& options,
                               std::vector<Loss>* lost) {
  stopIfAsked(options.stop);
  KeptMetadata kept = keptMetadata(picture, metadata, options.keep);
  if (options.mark) addEditMark(kept.segments, *options.mark, kept.lost);
  format.removeForeign(kept);
  const bool alpha = hasAlpha(picture);
  if (alpha && !format.keepsAlpha) {
    kept.lost.push_back({"transparency", "a " + std::string(format.name) + " file has none"});
  }
  std::vector<Loss> losses = std::move(kept.lost);
  const PictureSize size = {picture.width, picture.height};
  const auto writer = format.writer(size, alpha, std::move(kept), options);
  writer->write(picture.data.get(), picture.height);
  std::vector<std::uint8_t> file = writer->finish();
  if (lost != nullptr) *lost = std::move(losses);
  stopIfAsked(options.stop);
  return file;
}

std::vector<std::uint8_t> save(const Image<RGBA8Pixel>& picture, std::string_view format,
                               const Metadata& metadata, const SaveOptions& options,
                               std::vector<Loss>* lost) {
  const Format* known = formatNamed(format);
  if (known == nullptr) {
    throw PhotoError(PhotoError::Kind::invalidRequest,
                     "'" + std::string(format) + "' is no format that can be written");
  }
  return save(picture, *known, metadata, options, lost);
}

}  // namespace pelorin::photo
