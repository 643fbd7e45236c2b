#pragma once

#include <initializer_list>
#include <string>
#include <vector>

#include "image_processing/core/image.h"
#include "photo/jpeg/metadata_segment.h"
#include "tests/photo/metadata/exif_segments.h"

namespace pelorin::test_support {

Bytes joined(std::initializer_list<Bytes> parts);

/// A picture as a JPEG file with these segments.
Bytes jpegWith(const image_processing::Image<image_processing::RGBA8Pixel>& picture,
               const std::vector<photo::MetadataSegment>& segments = {});

/// The segment of a packet of XMP.
photo::MetadataSegment xmpSegment(const std::string& text);

/// A gain map of 32 x 64, the photo-like picture of seed 5, in the words of hdrgm or of ISO 21496-1.
Bytes gainMap(bool iso = false);

/// The boxes of an MP4 file.
Bytes video();

/// A photo of 64 x 128 that claims a gain map and a video, with this behind it. Every number among
/// the claims is wrong.
Bytes phonePhoto(int orientation, const Bytes& tail);

}  // namespace pelorin::test_support
