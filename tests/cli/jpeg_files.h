#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "image_processing/core/image.h"
#include "photo/jpeg/jpeg_codec.h"
#include "tests/cli/temporary_folder.h"

namespace pelorin::test_support {

using image_processing::Image;
using image_processing::RGBA8Pixel;

/// A picture as a JPEG file.
Bytes jpegOf(const Image<RGBA8Pixel>& picture,
             const std::vector<photo::MetadataSegment>& metadata = {}, int quality = 90);

/// A small photo-like JPEG file.
Bytes smallJpeg(std::uint64_t seed = 1);

/// A CMYK file (Adobe's, inverted) with these segments.
Bytes cmykJpeg(std::uint32_t width, std::uint32_t height,
               const std::vector<photo::MetadataSegment>& metadata = {});

/// A valid progressive grey file of 505 scans, each the refinement of one coefficient by one bit.
Bytes jpegOf505Scans();

/// The same file with another size in its header.
Bytes withHeaderSize(Bytes file, std::uint16_t width, std::uint16_t height);

/// The pixels of a JPEG file, as stored.
Image<RGBA8Pixel> decoded(const Bytes& file);

/// What an Exif segment may say here.
struct ExifFields {
  int orientation = 0;                       ///< 0: no such tag.
  std::string dateTime, subSeconds, offset;  ///< Of the original.
};

/// An APP1 payload, "Exif" and a TIFF file in either byte order.
Bytes exifPayload(const ExifFields& fields, bool littleEndian);

}  // namespace pelorin::test_support
