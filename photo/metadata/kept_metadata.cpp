#include "photo/metadata/kept_metadata.h"

#include <algorithm>
#include <string_view>

#include "photo/metadata/exif_orientation.h"

namespace pelorin::photo {
namespace {

constexpr std::uint8_t app1 = 0xE1, app2 = 0xE2;

bool isColourProfile(const MetadataSegment& segment) {
  constexpr std::string_view mark("ICC_PROFILE\0", 12);
  return segment.marker == app2 && segment.payload.size() >= mark.size() &&
         std::equal(mark.begin(), mark.end(), segment.payload.begin());
}

}  // namespace

const MetadataSegment* firstExif(std::span<const MetadataSegment> metadata) {
  for (const MetadataSegment& segment : metadata) {
    if (segment.marker == app1 && isExif(segment.payload)) return &segment;
  }
  return nullptr;
}

std::vector<MetadataSegment> keptMetadata(std::vector<MetadataSegment> segments, int channels) {
  if (channels != 3) std::erase_if(segments, isColourProfile);
  for (MetadataSegment& segment : segments) {
    if (segment.marker == app1) setExifOrientationUpright(segment.payload);
  }
  return segments;
}

}  // namespace pelorin::photo
