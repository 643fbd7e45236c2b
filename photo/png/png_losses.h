#pragma once

#include "photo/metadata/kept_metadata.h"

namespace pelorin::photo {

/// Brings metadata into the form that a PNG file can hold, and names what it has no place for: one
/// Exif segment, one packet of XMP with its extension within it, the resolution of JFIF as pHYs,
/// and nothing behind the picture, nor any claim to it.
void removeWhatPngLacks(KeptMetadata& kept);

}  // namespace pelorin::photo
