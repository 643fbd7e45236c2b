#pragma once

#include <span>
#include <vector>

#include "photo/jpeg/metadata_segment.h"

namespace pelorin::photo {

/// The Exif segment that counts, which is the first; null without one.
const MetadataSegment* firstExif(std::span<const MetadataSegment> metadata);

}  // namespace pelorin::photo
