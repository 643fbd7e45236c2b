#pragma once

#include <span>
#include <vector>

#include "photo/metadata/metadata_segment.h"

namespace pelorin::photo {

/// The Exif segment that counts, which is the first; null without one.
const MetadataSegment* firstExif(std::span<const MetadataSegment> metadata);

/// The segments that an upright picture made of a JPEG file keeps: all of them, byte for byte but
/// for an orientation of 1. Colour profiles of grey and CMYK files are left out, since they do not
/// describe RGB pixels.
/// @param channels  of the file.
std::vector<MetadataSegment> keptMetadata(std::vector<MetadataSegment> segments, int channels);

}  // namespace pelorin::photo
