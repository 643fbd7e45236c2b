#include "photo/photo.h"

#include <string>
#include <utility>

#include "photo/jpeg/jpeg_codec.h"
#include "photo/jpeg/jpeg_end.h"
#include "photo/metadata/exif_orientation.h"
#include "photo/metadata/first_exif.h"
#include "photo/metadata/kept_metadata.h"
#include "photo/png/png_file.h"
#include "photo/raw/raw_pixels.h"
#include "photo/turned_image.h"

namespace pelorin::photo {

using image_processing::Image;
using image_processing::RGBA8Pixel;

namespace {

void stopIfAsked(const std::stop_token& stop) {
  if (stop.stop_requested()) throw Stopped();
}

std::shared_ptr<Image<RGBA8Pixel>> decodedImage(std::span<const std::uint8_t> file,
                                                const OpenOptions& options, SparePixels& spare) {
  std::shared_ptr<Image<RGBA8Pixel>> image;
  const auto makeRoom = [&](std::uint32_t width, std::uint32_t height) {
    image = spare.picture(width, height);
    return reinterpret_cast<std::uint8_t*>(image->data.get());
  };
  decodeJpegInto(makeRoom, file, options.scale, options.limits);
  return image;
}

PhotoFacts factsOf(const JpegHeader& header) {
  PhotoFacts facts = {.format = "JPEG",
                      .width = header.width,
                      .height = header.height,
                      .channels = header.components,
                      .progressive = header.progressive};
  if (const MetadataSegment* exif = firstExif(header.metadata)) {
    facts.orientation = exifOrientation(exif->payload);
    facts.captureTime = exifCaptureTime(exif->payload);
  }
  return facts;
}

// What a JPEG file has beside its pixels; a profile for grey or CMYK does not describe RGB.
Metadata metadataOf(std::span<const std::uint8_t> file, JpegHeader header,
                    const PhotoFacts& facts) {
  if (header.components != 3) removeColourProfile(header.metadata);
  const auto tail = file.subspan(jpegEnd(file));
  return {.segments = std::move(header.metadata),
          .tail = {tail.begin(), tail.end()},
          .storedSize = {facts.width, facts.height},
          .orientation = facts.orientation};
}

void refuseEmpty(std::span<const std::uint8_t> file) {
  if (file.empty()) throw PhotoError(PhotoError::Kind::empty, "is empty, not a JPEG file");
}

}  // namespace

PhotoFacts readFacts(std::span<const std::uint8_t> file) {
  refuseEmpty(file);
  return factsOf(readJpegHeader(file));
}

Photo open(std::span<const std::uint8_t> file, const OpenOptions& options, SparePixels* spare) {
  stopIfAsked(options.stop);
  Photo photo;
  if (options.raw) {
    photo.facts = {.format = "raw pixels",
                   .width = options.raw->width,
                   .height = options.raw->height,
                   .channels = 4};
    photo.image = readRawPixels(file, *options.raw);
  } else {
    refuseEmpty(file);
    JpegHeader header = readJpegHeader(file);
    photo.facts = factsOf(header);
    photo.metadata = metadataOf(file, std::move(header), photo.facts);
    SparePixels none;
    photo.image = decodedImage(file, options, spare != nullptr ? *spare : none);
  }
  stopIfAsked(options.stop);
  if (options.upright) {
    photo.metadata.turn = turnedFurther(uprightTurn(photo.facts.orientation), options.rotate);
    photo.image = turned(photo.image, photo.metadata.turn);
  }
  if (options.faces && !options.raw)
    photo.faces = knownFaces(photo.metadata, {photo.image->width, photo.image->height});
  return photo;
}

std::vector<std::uint8_t> save(const Image<RGBA8Pixel>& picture, std::string_view format,
                               const Metadata& metadata, const SaveOptions& options,
                               std::vector<Loss>* losses) {
  stopIfAsked(options.stop);
  const auto* pixels = reinterpret_cast<const std::uint8_t*>(picture.data.get());
  std::vector<std::uint8_t> file;
  std::vector<Loss> lost;
  if (format == "JPEG") {
    KeptMetadata kept = keptMetadata(picture, metadata, options.keep);
    file = encodeJpeg(pixels, picture.width, picture.height, options.quality, kept.segments);
    appendTail(file, kept.tail);
    lost = std::move(kept.lost);
  } else if (format == "PNG") {
    file = encodePng(picture);
    if (!metadata.segments.empty() || !metadata.tail.empty())
      lost.push_back({"metadata", "PNG files carry none yet"});
  } else if (format == "raw pixels") {
    file.assign(pixels, pixels + picture.byteSize());
  } else {
    throw PhotoError(PhotoError::Kind::invalidRequest,
                     "'" + std::string(format) + "' is no format that can be written");
  }
  if (losses != nullptr) *losses = std::move(lost);
  stopIfAsked(options.stop);
  return file;
}

}  // namespace pelorin::photo
