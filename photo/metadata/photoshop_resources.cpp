#include "photo/metadata/photoshop_resources.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <string_view>

namespace pelorin::photo {
namespace {

constexpr std::uint8_t app13 = 0xED;
constexpr std::string_view mark("Photoshop 3.0\0", 14), resourceMark = "8BIM";
constexpr unsigned thumbnailOfVersion4 = 0x0409, thumbnail = 0x040C;

bool isResources(const MetadataSegment& segment) {
  return segment.marker == app13 && segment.payload.size() >= mark.size() &&
         std::equal(mark.begin(), mark.end(), segment.payload.begin());
}

struct Resource {
  unsigned id;
  std::size_t size;  // of all of it; 0 when it is cut off
};

// Mark, number, a name with its length, padded to even, then length and data, padded likewise.
Resource resourceAt(const std::vector<std::uint8_t>& bytes, std::size_t at) {
  const std::size_t left = bytes.size() - at;
  const auto* resource = bytes.data() + at;
  if (left < 12 || !std::equal(resourceMark.begin(), resourceMark.end(), resource)) return {0, 0};
  const std::size_t nameSize = (std::size_t{resource[6]} + 2) / 2 * 2;
  const std::size_t sizePlace = 6 + nameSize;
  if (left < sizePlace + 4) return {0, 0};
  std::uint64_t size = 0;
  for (std::size_t i = 0; i < 4; ++i) size = size << 8 | resource[sizePlace + i];
  size = std::min<std::uint64_t>((size + 1) / 2 * 2, left);
  if (size > left - sizePlace - 4) return {0, 0};
  return {static_cast<unsigned>(resource[4] << 8 | resource[5]),
          static_cast<std::size_t>(sizePlace + 4 + size)};
}

}  // namespace

void removePhotoshopThumbnails(std::vector<MetadataSegment>& segments, std::vector<Loss>& lost) {
  for (MetadataSegment& segment : segments) {
    if (!isResources(segment)) continue;
    std::vector<std::uint8_t>& bytes = segment.payload;
    for (std::size_t at = mark.size(); at < bytes.size();) {
      const Resource resource = resourceAt(bytes, at);
      if (resource.size == 0) break;
      if (resource.id != thumbnailOfVersion4 && resource.id != thumbnail) {
        at += resource.size;
        continue;
      }
      const auto begin = bytes.begin() + static_cast<std::ptrdiff_t>(at);
      bytes.erase(begin, begin + static_cast<std::ptrdiff_t>(resource.size));
      lost.push_back({"Photoshop thumbnail", "shows the picture as it was"});
    }
  }
}

}  // namespace pelorin::photo
