#include "photo/metadata/segments.h"

#include <algorithm>
#include <string>

namespace pelorin::photo {
namespace {

constexpr std::uint8_t app2 = 0xE2;
constexpr std::string_view profileMark("ICC_PROFILE\0", 12);
constexpr std::size_t profileHead = profileMark.size() + 2;  // then which part, and of how many

bool begins(const MetadataSegment& segment, std::uint8_t marker, std::string_view mark) {
  return segment.marker == marker && segment.payload.size() >= mark.size() &&
         std::equal(mark.begin(), mark.end(), segment.payload.begin());
}

}  // namespace

bool isColourProfile(const MetadataSegment& segment) {
  return begins(segment, app2, profileMark);
}

bool isIsoGainMap(const MetadataSegment& segment) {
  return begins(segment, app2, std::string_view("urn:iso:std:iso:ts:21496:-1\0", 28));
}

MetadataSegment segmentOf(std::uint8_t marker, std::string_view mark,
                          std::span<const std::uint8_t> content) {
  MetadataSegment segment{marker, {mark.begin(), mark.end()}};
  segment.payload.insert(segment.payload.end(), content.begin(), content.end());
  return segment;
}

std::span<const std::uint8_t> contentOf(std::span<const MetadataSegment> segments,
                                        std::uint8_t marker, std::string_view mark) {
  for (const MetadataSegment& segment : segments) {
    if (begins(segment, marker, mark)) return std::span(segment.payload).subspan(mark.size());
  }
  return {};
}

void addColourProfile(std::span<const std::uint8_t> profile,
                      std::vector<MetadataSegment>& segments) {
  constexpr std::size_t longest = 65533 - profileHead, mostParts = 255;
  const std::size_t parts = (profile.size() + longest - 1) / longest;
  if (parts > mostParts) return;
  for (std::size_t part = 1; part <= parts; ++part) {
    std::string mark(profileMark);
    mark += static_cast<char>(part);
    mark += static_cast<char>(parts);
    const std::size_t length = std::min(longest, profile.size());
    segments.push_back(segmentOf(app2, mark, profile.first(length)));
    profile = profile.subspan(length);
  }
}

std::vector<std::uint8_t> colourProfileOf(std::span<const MetadataSegment> segments) {
  std::vector<const MetadataSegment*> parts;
  for (const MetadataSegment& segment : segments) {
    if (isColourProfile(segment) && segment.payload.size() >= profileHead)
      parts.push_back(&segment);
  }
  const auto numberOf = [](const MetadataSegment* s) { return s->payload[profileHead - 2]; };
  std::sort(parts.begin(), parts.end(), [&](auto a, auto b) { return numberOf(a) < numberOf(b); });
  std::vector<std::uint8_t> profile;
  for (std::size_t i = 0; i < parts.size(); ++i) {
    const bool isWhole =
        numberOf(parts[i]) == i + 1 && parts[i]->payload[profileHead - 1] == parts.size();
    if (!isWhole) return {};
    profile.insert(profile.end(), parts[i]->payload.begin() + profileHead, parts[i]->payload.end());
  }
  return profile;
}

bool isGreyProfile(std::span<const MetadataSegment> segments) {
  constexpr std::string_view grey = "GRAY";
  constexpr std::size_t spacePlace = 16;
  const std::vector<std::uint8_t> profile = colourProfileOf(segments);
  return profile.size() >= spacePlace + grey.size() &&
         std::equal(grey.begin(), grey.end(), profile.begin() + spacePlace);
}

}  // namespace pelorin::photo
