#include "photo/photo.h"

#include <utility>

#include "cli/frame/errors.h"
#include "cli/frame/file_bytes.h"
#include "cli/frame/interrupt.h"
#include "photo/metadata/exif_orientation.h"
#include "photo/metadata/kept_metadata.h"
#include "photo/turn.h"

namespace pelorin::cli {

using image_processing::Image;
using image_processing::RGBA8Pixel;

std::shared_ptr<Image<RGBA8Pixel>> decodedImage(std::span<const std::uint8_t> file, int scale,
                                                SparePixels& spare) {
  std::shared_ptr<Image<RGBA8Pixel>> image;
  const auto makeRoom = [&](std::uint32_t width, std::uint32_t height) {
    image = spare.picture(width, height);
    return reinterpret_cast<std::uint8_t*>(image->data.get());
  };
  imgproc::decodeJpegInto(makeRoom, file, scale);
  return image;
}

JpegFacts readFacts(const imgproc::JpegHeader& header) {
  JpegFacts facts = {header.width, header.height, header.components, header.progressive, 1, {}};
  if (const imgproc::MetadataSegment* exif = firstExif(header.metadata)) {
    facts.orientation = exifOrientation(exif->payload);
    facts.captureTime = exifCaptureTime(exif->payload);
  }
  return facts;
}

Photo loadPhoto(const Input& input, const PhotoOptions& options) {
  SparePixels none;
  return loadPhoto(input, options, none);
}

Photo loadPhoto(const Input& input, const PhotoOptions& options, SparePixels& spare) {
  Photo photo;
  Turn turn;
  if (options.raw) {
    photo.image = readRawPixels(input, *options.raw);
  } else {
    const std::vector<std::uint8_t> file = readInput(input);
    stopIfInterrupted();
    if (file.empty()) throw FileError("is empty, not a JPEG file");
    imgproc::JpegHeader header = imgproc::readJpegHeader(file);
    photo.facts = readFacts(header);
    photo.metadata = keptMetadata(std::move(header));
    photo.image = decodedImage(file, options.scale, spare);
    turn = uprightTurn(photo.facts->orientation);
  }
  stopIfInterrupted();
  photo.image = turned(photo.image, turnedFurther(turn, options.rotate));
  return photo;
}

void savePicture(const std::string& path, const Image<RGBA8Pixel>& picture, bool raw, int quality,
                 const std::vector<imgproc::MetadataSegment>& metadata) {
  const auto* pixels = reinterpret_cast<const std::uint8_t*>(picture.data.get());
  if (raw) return writeOutput(path, {pixels, picture.byteSize()});
  const std::vector<std::uint8_t> file =
      imgproc::encodeJpeg(pixels, picture.width, picture.height, quality, metadata);
  stopIfInterrupted();
  writeOutput(path, file);
}

}  // namespace pelorin::cli
