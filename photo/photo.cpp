#include "photo/photo.h"

#include <algorithm>
#include <bit>
#include <cstring>
#include <utility>

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

std::unique_ptr<RowReader> readerOf(std::span<const std::uint8_t> file,
                                    const OpenOptions& options) {
  const Format& format = options.raw ? rawPixels() : formatOf(file);
  std::unique_ptr<RowReader> reader = format.reader(file, options);
  const std::uint32_t divisor = divisorOf(options.scale);
  if (divisor == 1 || format.scalesWhileDecoding) return reader;
  return reducedRows(std::move(reader), divisor);
}

// Turned while it comes, so that there is one picture and not two.
std::shared_ptr<Image<RGBA8Pixel>> readTurned(RowReader& reader, Turn turn, SparePixels& spare) {
  const PictureSize size = reader.size(), upright = turnedSize(size, turn);
  const std::shared_ptr<Image<RGBA8Pixel>> picture = spare.picture(upright.width, upright.height);
  if (turn == Turn{}) {
    reader.read(picture->data.get(), size.height);
    return picture;
  }
  const Image<RGBA8Pixel> room(size.width, std::min(size.height, rowsAtOnce));
  for (std::uint32_t y = 0; y < size.height;) {
    const std::uint32_t count = std::min(size.height - y, room.height);
    reader.read(room.data.get(), count);
    turnRows(room.data.get(), y, count, size, turn, *picture);
    y += count;
  }
  return picture;
}

bool isOpaque(const RGBA8Pixel* pixels, std::size_t count) {
  std::uint32_t all = ~0u;  // of every channel: a loop without a branch, of which vectors are made
#pragma GCC unroll 8
  for (std::size_t i = 0; i < count; ++i) {
    std::uint32_t pixel;
    std::memcpy(&pixel, pixels + i, sizeof pixel);
    all &= pixel;
  }
  return std::bit_cast<RGBA8Pixel>(all).a == 255;
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
  if (options.upright)
    photo.metadata.turn = turnedFurther(uprightTurn(photo.facts.orientation), options.rotate);
  SparePixels none;
  photo.image = readTurned(*rows, photo.metadata.turn, spare != nullptr ? *spare : none);
  stopIfAsked(options.stop);
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
  const bool alpha = format.keepsAlpha && !isOpaque(picture.data.get(), picture.pixelCount());
  std::vector<Loss> losses = std::move(kept.lost);
  const PictureSize size = {picture.width, picture.height};
  const auto writer = format.writer(size, alpha, std::move(kept), options);
  bool opaque = true;
  for (std::uint32_t y = 0; y < size.height;) {
    const std::uint32_t count = std::min(size.height - y, rowsAtOnce);
    writer->write(picture.row(y), count);
    // Behind the writer, while the rows are near: memory would take longer than the looking.
    if (!format.keepsAlpha) {
      opaque = isOpaque(picture.row(y), std::size_t{count} * size.width) && opaque;
    }
    y += count;
  }
  if (!opaque)
    losses.push_back({"transparency", "a " + std::string(format.name) + " file has none"});
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
