#pragma once

#include <span>

#include "photo/metadata/edit_mark.h"
#include "photo/metadata/exif_orientation.h"
#include "photo/metadata/first_exif.h"
#include "photo/photo_facts.h"

namespace pelorin::photo {

/// What its segments say of a photo: orientation, capture time, how Quenby edited it.
inline void addStatedFacts(std::span<const MetadataSegment> metadata, PhotoFacts& facts) {
  if (const MetadataSegment* exif = firstExif(metadata)) {
    facts.orientation = exifOrientation(exif->payload);
    facts.captureTime = exifCaptureTime(exif->payload);
  }
  facts.edits = editMarksOf(metadata);
}

}  // namespace pelorin::photo
