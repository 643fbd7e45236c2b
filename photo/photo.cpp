#include "photo/photo.h"

#include <algorithm>
#include <bit>
#include <utility>

#include "photo/file_size.h"
#include "photo/photo_writer.h"
#include "photo/reduced_rows.h"
#include "photo/turned_image.h"

namespace pelorin::photo {

using image_processing::Image;
using image_processing::RGBA8Pixel;

namespace {

// What a processor has room for beside its work, in whole blocks of any codec.
constexpr std::uint32_t rowsAtOnce = 64;

// As decoders that scale take it.
std::uint32_t divisorOf(int scale) {
  return std::min(8u, std::bit_floor(static_cast<unsigned>(std::max(1, scale))));
}

std::unique_ptr<RowReader> readerOf(const FileView& file, const OpenOptions& options) {
  checkFileSize(file.size(), options.limits);
  const Format& format = options.raw ? rawPixels() : formatOf(file.bytes);
  std::unique_ptr<RowReader> reader = format.reader(file, options);
  const std::uint32_t divisor = divisorOf(options.scale);
  if (divisor == 1 || format.scalesWhileDecoding) return reader;
  return reducedRows(std::move(reader), divisor);
}

}  // namespace

void stopIfAsked(const std::stop_token& stop) {
  if (stop.stop_requested()) throw Stopped();
}

std::unique_ptr<RowReader> openRows(const FileView& file, const OpenOptions& options) {
  stopIfAsked(options.stop);
  return readerOf(file, options);
}

PhotoFacts readFacts(std::span<const std::uint8_t> file, const DecodeLimits& limits) {
  return readerOf(file, {.limits = limits})->facts();
}

Photo open(std::span<const std::uint8_t> file, const OpenOptions& options, SparePixels* spare) {
  const std::unique_ptr<RowReader> rows = openRows(file, options);
  Photo photo{nullptr, rows->facts(), rows->metadata(), {}};
  if (options.upright)
    photo.metadata.turn = turnedFurther(uprightTurn(photo.facts.orientation), options.rotate);
  SparePixels none;
  const PictureSize size = turnedSize(rows->size(), photo.metadata.turn);
  photo.image = (spare != nullptr ? *spare : none).picture(size.width, size.height);
  readTurned(*rows, photo.metadata.turn, *photo.image);
  stopIfAsked(options.stop);
  if (options.faces && !options.raw)
    photo.faces = knownFaces(photo.metadata, {photo.image->width, photo.image->height});
  return photo;
}

std::vector<std::uint8_t> save(const Image<RGBA8Pixel>& picture, const Format& format,
                               const Metadata& metadata, const SaveOptions& options,
                               std::vector<Loss>* lost) {
  stopIfAsked(options.stop);
  const bool alpha = !format.keepsAlpha || !isOpaque(picture.data.get(), picture.pixelCount());
  PhotoWriter writer({picture.width, picture.height}, format, alpha, metadata, options);
  for (std::uint32_t y = 0; y < picture.height;) {
    const std::uint32_t count = std::min(picture.height - y, rowsAtOnce);
    writer.write(picture.row(y), count);
    y += count;
  }
  return writer.finish(lost);
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
