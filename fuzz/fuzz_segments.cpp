// Bytes as what JPEG segments hold beside EXIF and XMP: indices of several pictures, colour profiles and
// Photoshop's resources. What is written is read again as it was.
#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <span>
#include <vector>

#include "photo/metadata/mpf.h"
#include "photo/metadata/photoshop_resources.h"
#include "photo/metadata/segments.h"

using namespace pelorin::photo;

namespace {

constexpr std::uint8_t app2 = 0xE2, app13 = 0xED;

void require(bool holds) {
  if (!holds) std::abort();
}

std::vector<std::uint8_t> join(std::string_view mark, std::span<const std::uint8_t> content) {
  std::vector<std::uint8_t> bytes(mark.begin(), mark.end());
  bytes.insert(bytes.end(), content.begin(), content.end());
  return bytes;
}

void indices(std::span<const std::uint8_t> content) {
  for (const std::string_view mark : {"", "MPF\0II*\0\10\0\0\0", "MPF\0MM\0*\0\0\0\10"}) {
    const auto payload = join(mark.empty() ? mark : std::string_view(mark.data(), 12), content);
    isMpf(payload);
    const std::vector<MpfEntry> entries = readMpf(payload);
    if (entries.empty()) continue;
    const std::vector<MpfEntry> again = readMpf(writeMpf(entries));
    require(std::ranges::equal(again, entries, [](const MpfEntry& a, const MpfEntry& b) {
      return a.attributes == b.attributes && a.size == b.size && a.offset == b.offset;
    }));
  }
}

void profiles(std::span<const std::uint8_t> content) {
  std::vector<MetadataSegment> written;
  addColourProfile(content, written);
  const auto read = colourProfileOf(written);
  require(std::ranges::equal(read, content));
  isGreyProfile(written);
  // Parts in any order, one of them changed.
  std::vector<MetadataSegment> parts = {
      segmentOf(app2, std::string_view("ICC_PROFILE\0", 12), content)};
  parts.push_back(parts[0]);
  if (parts[1].payload.size() > 12) parts[1].payload[12] ^= 3;
  colourProfileOf(parts);
  isGreyProfile(parts);
}

void resources(std::span<const std::uint8_t> content) {
  std::vector<MetadataSegment> segments = {
      segmentOf(app13, std::string_view("Photoshop 3.0\0", 14), content),
      segmentOf(app13, std::string_view("Photoshop 3.0\0008BIM", 18), content)};
  for (const MetadataSegment& segment : segments) {
    iptcExcerpt(segment, std::span<const std::uint8_t>());
    const std::uint8_t sets[] = {80, 116, 55};
    iptcExcerpt(segment, sets);
  }
  std::vector<Loss> lost, lostAgain;
  removePhotoshopThumbnails(segments, lost);
  removePhotoshopThumbnails(segments, lostAgain);
  require(lostAgain.empty());
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::span content(data, size);
  indices(content);
  profiles(content);
  resources(content);
  return 0;
}
