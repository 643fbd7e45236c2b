#pragma once

#include <span>
#include <vector>

#include "photo/jpeg/jpeg_codec.h"

namespace pelorin::cli {

/// The Exif segment that counts, which is the first; null without one.
const imgproc::MetadataSegment* firstExif(std::span<const imgproc::MetadataSegment> metadata);

/// The segments that an upright picture made of this file keeps: all of them, byte for byte but for
/// an orientation of 1. Colour profiles of grey and CMYK files are left out, since they do not
/// describe RGB pixels.
std::vector<imgproc::MetadataSegment> keptMetadata(imgproc::JpegHeader header);

}  // namespace pelorin::cli
