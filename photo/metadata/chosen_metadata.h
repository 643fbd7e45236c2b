#pragma once

#include <set>

#include "photo/metadata/metadata.h"

namespace pelorin::photo {

/// What of a photo's metadata can be asked for by name.
enum class MetadataKind {
  copyright,  ///< Who made it and who may use it, in Exif, XMP, IPTC and texts.
  time,       ///< When it was taken, likewise.
  exif,
  xmp,
  iptc,
  gainMap
};

/// These kinds of a photo's metadata alone, and what tells its colours.
Metadata chosenMetadata(const Metadata& metadata, const std::set<MetadataKind>& kinds);

}  // namespace pelorin::photo
