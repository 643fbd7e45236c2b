#pragma once

#include <span>

#include "photo/metadata/exif_orientation.h"
#include "photo/metadata/first_exif.h"
#include "photo/photo_facts.h"

namespace pelorin::photo {

/// What its Exif segment says of a photo: orientation, capture time.
inline void addExifFacts(std::span<const MetadataSegment> metadata, PhotoFacts& facts) {
  if (const MetadataSegment* exif = firstExif(metadata)) {
    facts.orientation = exifOrientation(exif->payload);
    facts.captureTime = exifCaptureTime(exif->payload);
  }
}

}  // namespace pelorin::photo
