#include "photo/metadata/photoshop_resources.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <string_view>

namespace pelorin::photo {
namespace {

constexpr std::uint8_t app13 = 0xED;
constexpr std::string_view mark("Photoshop 3.0\0", 14), resourceMark = "8BIM";
constexpr unsigned thumbnailOfVersion4 = 0x0409, thumbnail = 0x040C, iptcResource = 0x0404;

struct Resource {
  unsigned id;
  std::size_t size;                    // of all of it; 0 when it is cut off
  std::size_t data = 0, dataSize = 0;  // from its beginning
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
  const std::size_t room = left - sizePlace - 4;
  if (size > room) return {0, 0};
  const std::uint64_t padded = std::min<std::uint64_t>((size + 1) / 2 * 2, room);  // some forget it
  return {static_cast<unsigned>(resource[4] << 8 | resource[5]),
          static_cast<std::size_t>(sizePlace + 4 + padded), sizePlace + 4,
          static_cast<std::size_t>(size)};
}

// Data sets: mark, record, number, length, data. An extended length has its first bit set.
std::vector<std::uint8_t> chosenSets(std::span<const std::uint8_t> iptc,
                                     std::span<const std::uint8_t> wanted) {
  constexpr std::size_t head = 5;
  constexpr std::uint8_t setMark = 0x1C, characterSet = 90;
  std::vector<std::uint8_t> chosen;
  bool found = false;
  while (iptc.size() >= head && iptc[0] == setMark && iptc[3] < 0x80) {
    const std::size_t size = head + (std::size_t{iptc[3]} << 8 | iptc[4]);
    if (size > iptc.size()) break;
    const bool isWanted = iptc[1] == 2 && std::ranges::find(wanted, iptc[2]) != wanted.end();
    if (isWanted || (iptc[1] == 1 && iptc[2] == characterSet))
      chosen.insert(chosen.end(), iptc.begin(), iptc.begin() + static_cast<std::ptrdiff_t>(size));
    found = found || isWanted;
    iptc = iptc.subspan(size);
  }
  if (!found) chosen.clear();
  return chosen;
}

}  // namespace

bool isPhotoshopResources(const MetadataSegment& segment) {
  return segment.marker == app13 && segment.payload.size() >= mark.size() &&
         std::equal(mark.begin(), mark.end(), segment.payload.begin());
}

MetadataSegment iptcExcerpt(const MetadataSegment& segment,
                            std::span<const std::uint8_t> dataSets) {
  MetadataSegment excerpt = {app13, {}};
  if (!isPhotoshopResources(segment)) return excerpt;
  const std::vector<std::uint8_t>& bytes = segment.payload;
  for (std::size_t at = mark.size(); at < bytes.size();) {
    const Resource resource = resourceAt(bytes, at);
    if (resource.size == 0) break;
    if (resource.id == iptcResource) {
      const std::vector<std::uint8_t> chosen =
          chosenSets(std::span(bytes).subspan(at + resource.data, resource.dataSize), dataSets);
      if (chosen.empty()) return excerpt;
      const auto size = static_cast<std::uint32_t>(chosen.size());
      excerpt.payload.assign(mark.begin(), mark.end());
      excerpt.payload.insert(excerpt.payload.end(), resourceMark.begin(), resourceMark.end());
      for (const unsigned byte : {iptcResource >> 8, iptcResource & 255, 0u, 0u, size >> 24 & 255,
                                  size >> 16 & 255, size >> 8 & 255, size & 255})
        excerpt.payload.push_back(static_cast<std::uint8_t>(byte));
      excerpt.payload.insert(excerpt.payload.end(), chosen.begin(), chosen.end());
      if (size % 2 != 0) excerpt.payload.push_back(0);
      return excerpt;
    }
    at += resource.size;
  }
  return excerpt;
}

void removePhotoshopThumbnails(std::vector<MetadataSegment>& segments, std::vector<Loss>& lost) {
  for (MetadataSegment& segment : segments) {
    if (!isPhotoshopResources(segment)) continue;
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
