#include "photo/metadata/first_exif.h"

#include "photo/metadata/exif_orientation.h"

namespace pelorin::photo {

const MetadataSegment* firstExif(std::span<const MetadataSegment> metadata) {
  constexpr std::uint8_t app1 = 0xE1;
  for (const MetadataSegment& segment : metadata) {
    if (segment.marker == app1 && isExif(segment.payload)) return &segment;
  }
  return nullptr;
}

}  // namespace pelorin::photo
