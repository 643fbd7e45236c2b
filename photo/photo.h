#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <span>
#include <vector>

#include "cli/frame/inputs.h"
#include "image_processing/core/image.h"
#include "photo/jpeg/jpeg_codec.h"
#include "photo/metadata/capture_time.h"
#include "photo/raw/raw_pixels.h"
#include "photo/spare_pixels.h"

namespace pelorin::cli {

/// What a JPEG file says of itself; the size is the stored one, before scaling and turning.
struct JpegFacts {
  std::uint32_t width, height;
  int components;
  bool progressive;
  int orientation;  ///< EXIF, 1 ... 8.
  std::optional<CaptureTime> captureTime;
};

/// A decoded picture, upright.
struct Photo {
  std::shared_ptr<image_processing::Image<image_processing::RGBA8Pixel>> image;
  std::optional<JpegFacts> facts;                  ///< None for raw pixels.
  std::vector<imgproc::MetadataSegment> metadata;  ///< What a file made of it keeps.
};

struct PhotoOptions {
  int scale = 1;               ///< 1, 2, 4 or 8: the decoder's divisor.
  int rotate = 0;              ///< Degrees clockwise beyond upright, a multiple of 90.
  std::optional<RawSize> raw;  ///< The input is raw pixels of this size.
};

/// Reads a photo, decodes it and turns it upright.
/// @param spare  where the pixels of a decoded one may come from.
/// @throws what reading and decoding throw, for `explain`; Interrupted on Ctrl-C.
Photo loadPhoto(const Input& input, const PhotoOptions& options, SparePixels& spare);
Photo loadPhoto(const Input& input, const PhotoOptions& options);

/// The picture of a JPEG file at 1/`scale` of its size, as it is stored.
/// @param spare  where its pixels may come from.
/// @throws what decoding throws.
std::shared_ptr<image_processing::Image<image_processing::RGBA8Pixel>> decodedImage(
    std::span<const std::uint8_t> file, int scale, SparePixels& spare);

/// What the header alone tells, without decoding.
JpegFacts readFacts(const imgproc::JpegHeader& header);

/// Writes a picture to a file or standard output, as JPEG or, with `raw`, as raw pixels.
/// @throws what encoding and writing throw; an old file is then as it was.
void savePicture(const std::string& path,
                 const image_processing::Image<image_processing::RGBA8Pixel>& picture, bool raw,
                 int quality, const std::vector<imgproc::MetadataSegment>& metadata);

}  // namespace pelorin::cli
