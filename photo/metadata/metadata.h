#pragma once

#include <vector>

#include "photo/metadata/metadata_segment.h"

namespace pelorin::photo {

/// What a photo says beside its pixels.
struct Metadata {
  /// EXIF, XMP, colour profile and the rest, as a JPEG file has them, whatever the file was; in its
  /// order.
  std::vector<MetadataSegment> segments;
};

}  // namespace pelorin::photo
