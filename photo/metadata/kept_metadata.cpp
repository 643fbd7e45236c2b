#include "photo/metadata/kept_metadata.h"

#include <algorithm>
#include <string_view>
#include <utility>

#include "photo/metadata/exif_orientation.h"

namespace pelorin::cli {
namespace {

constexpr std::uint8_t app1 = 0xE1, app2 = 0xE2;

bool isColourProfile(const imgproc::MetadataSegment& segment) {
  constexpr std::string_view mark("ICC_PROFILE\0", 12);
  return segment.marker == app2 && segment.payload.size() >= mark.size() &&
         std::equal(mark.begin(), mark.end(), segment.payload.begin());
}

}  // namespace

const imgproc::MetadataSegment* firstExif(std::span<const imgproc::MetadataSegment> metadata) {
  for (const imgproc::MetadataSegment& segment : metadata) {
    if (segment.marker == app1 && isExif(segment.payload)) return &segment;
  }
  return nullptr;
}

std::vector<imgproc::MetadataSegment> keptMetadata(imgproc::JpegHeader header) {
  if (header.components != 3) {
    std::erase_if(header.metadata, isColourProfile);
  }
  for (imgproc::MetadataSegment& segment : header.metadata) {
    if (segment.marker == app1) setExifOrientationUpright(segment.payload);
  }
  return std::move(header.metadata);
}

}  // namespace pelorin::cli
