#include "photo/metadata/mpf.h"

#include <algorithm>
#include <string_view>

#include "photo/metadata/tiff.h"

namespace pelorin::photo {
namespace {

constexpr std::string_view mark("MPF\0", mpfHeaderPlace);
constexpr std::uint16_t versionTag = 0xB000, numberTag = 0xB001, entryTag = 0xB002;
constexpr std::uint32_t entrySize = 16, tags = 3, directoryPlace = 8;

void put(std::vector<std::uint8_t>& bytes, std::uint32_t value, int size) {
  for (int i = size - 1; i >= 0; --i) bytes.push_back(static_cast<std::uint8_t>(value >> 8 * i));
}

}  // namespace

bool isMpf(std::span<const std::uint8_t> payload) {
  return payload.size() >= mark.size() && std::equal(mark.begin(), mark.end(), payload.begin());
}

std::vector<MpfEntry> readMpf(std::span<const std::uint8_t> payload) {
  if (!isMpf(payload)) return {};
  const Tiff tiff(payload.subspan(mpfHeaderPlace));
  const TiffDirectory directory = tiff.firstDirectory();
  const TiffEntry* table = directory.find(entryTag);
  if (table == nullptr) return {};
  std::vector<MpfEntry> entries;
  for (std::uint64_t at = 0; table->valueSize - at >= entrySize; at += entrySize) {
    const std::uint64_t place = table->valuePlace + at;
    entries.push_back({tiff.read32(place), tiff.read32(place + 4), tiff.read32(place + 8)});
  }
  return entries;
}

std::vector<std::uint8_t> writeMpf(std::span<const MpfEntry> entries) {
  const auto count = static_cast<std::uint32_t>(entries.size());
  std::vector<std::uint8_t> bytes(mark.begin(), mark.end());
  put(bytes, 'M' << 8 | 'M', 2);
  put(bytes, 42, 2);
  put(bytes, directoryPlace, 4);
  put(bytes, tags, 2);
  put(bytes, versionTag, 2), put(bytes, 7, 2), put(bytes, 4, 4);
  for (const char digit : std::string_view("0100"))
    put(bytes, static_cast<unsigned char>(digit), 1);
  put(bytes, numberTag, 2), put(bytes, 4, 2), put(bytes, 1, 4), put(bytes, count, 4);
  put(bytes, entryTag, 2), put(bytes, 7, 2), put(bytes, entrySize * count, 4);
  put(bytes, directoryPlace + 2 + 12 * tags + 4, 4);
  put(bytes, 0, 4);  // no directory follows
  for (const MpfEntry& entry : entries) {
    put(bytes, entry.attributes, 4);
    put(bytes, entry.size, 4);
    put(bytes, entry.offset, 4);
    put(bytes, 0, 4);  // depends on no other pictures
  }
  return bytes;
}

}  // namespace pelorin::photo
