#include "photo/metadata/exif_excerpt.h"

#include <algorithm>

#include "photo/metadata/exif_orientation.h"
#include "photo/metadata/segments.h"
#include "photo/metadata/tiff.h"

namespace pelorin::photo {
namespace {

using Bytes = std::span<const std::uint8_t>;

constexpr std::uint16_t exifDirectory = 0x8769, exifVersion = 0x9000;
constexpr std::uint16_t textType = 2, longType = 4, undefinedType = 7;

struct Entry {
  std::uint16_t tag, type;
  Bytes value;
};

void put(std::vector<std::uint8_t>& bytes, std::uint64_t value, int size) {
  for (int i = size - 1; i >= 0; --i) bytes.push_back(static_cast<std::uint8_t>(value >> 8 * i));
}

std::vector<Entry> chosenOf(const TiffDirectory& directory, Bytes file,
                            std::span<const std::uint16_t> tags) {
  std::vector<Entry> chosen;
  for (const TiffEntry& entry : directory.entries) {
    // A directory that repeats a tag could make much of few bytes.
    const bool isWanted = entry.type == textType &&
                          std::ranges::find(tags, entry.tag) != tags.end() &&
                          std::ranges::find(chosen, entry.tag, &Entry::tag) == chosen.end();
    if (isWanted)
      chosen.push_back({entry.tag, entry.type, file.subspan(entry.valuePlace, entry.valueSize)});
  }
  return chosen;
}

std::uint64_t sizeOf(const std::vector<Entry>& entries, bool withPointer) {
  std::uint64_t size = 2 + 12 * (entries.size() + (withPointer ? 1 : 0)) + 4;
  for (const Entry& entry : entries) size += entry.value.size() > 4 ? entry.value.size() : 0;
  return size;
}

// Values stand behind their directory, whose tags go up.
void putDirectory(std::vector<std::uint8_t>& tiff, std::vector<Entry> entries) {
  std::sort(entries.begin(), entries.end(),
            [](const Entry& a, const Entry& b) { return a.tag < b.tag; });
  std::uint64_t place = tiff.size() + 2 + 12 * entries.size() + 4;
  put(tiff, entries.size(), 2);
  for (const Entry& entry : entries) {
    put(tiff, entry.tag, 2), put(tiff, entry.type, 2);
    put(tiff, entry.type == longType ? 1 : entry.value.size(), 4);
    if (entry.value.size() > 4) {
      put(tiff, place, 4);
      place += entry.value.size();
    } else {
      tiff.insert(tiff.end(), entry.value.begin(), entry.value.end());
      tiff.resize(tiff.size() + 4 - entry.value.size());
    }
  }
  put(tiff, 0, 4);
  for (const Entry& entry : entries) {
    if (entry.value.size() > 4) tiff.insert(tiff.end(), entry.value.begin(), entry.value.end());
  }
}

}  // namespace

std::vector<std::uint8_t> exifExcerpt(Bytes payload, std::span<const std::uint16_t> tags) {
  if (!isExif(payload)) return {};
  const Bytes file = payload.subspan(exifMark.size());
  const Tiff tiff(file);
  const TiffDirectory first = tiff.firstDirectory();
  const TiffDirectory exif = tiff.directoryOf(first.find(exifDirectory));
  std::vector<Entry> firstEntries = chosenOf(first, file, tags);
  std::vector<Entry> exifEntries = chosenOf(exif, file, tags);
  if (firstEntries.empty() && exifEntries.empty()) return {};
  std::vector<std::uint8_t> pointer;
  if (!exifEntries.empty()) {
    if (const TiffEntry* version = exif.find(exifVersion); version && version->valueSize == 4)
      exifEntries.push_back({exifVersion, undefinedType, file.subspan(version->valuePlace, 4)});
    constexpr std::uint64_t headerSize = 8;
    put(pointer, headerSize + sizeOf(firstEntries, true), 4);
    firstEntries.push_back({exifDirectory, longType, pointer});
  }
  std::vector<std::uint8_t> written = {'M', 'M', 0, 42, 0, 0, 0, 8};
  putDirectory(written, std::move(firstEntries));
  if (!exifEntries.empty()) putDirectory(written, std::move(exifEntries));
  constexpr std::uint8_t app1 = 0xE1;
  return segmentOf(app1, exifMark, written).payload;
}

}  // namespace pelorin::photo
