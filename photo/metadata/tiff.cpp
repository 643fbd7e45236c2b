#include "photo/metadata/tiff.h"

#include <algorithm>

namespace pelorin::photo {
namespace {

constexpr std::uint64_t entrySize = 12, headerSize = 8;
constexpr std::uint16_t shortType = 3, longType = 4, directoryType = 13;

// Of the twelve types of TIFF 6.0 and the two that others added; 0 for what is none.
std::uint64_t sizeOfType(std::uint16_t type) {
  constexpr std::uint8_t sizes[] = {0, 1, 1, 2, 4, 8, 1, 1, 2, 4, 8, 4, 8, 4};
  return type < std::size(sizes) ? sizes[type] : 0;
}

}  // namespace

const TiffEntry* TiffDirectory::find(std::uint16_t tag) const {
  const auto found = std::find_if(entries.begin(), entries.end(),
                                  [&](const TiffEntry& entry) { return entry.tag == tag; });
  return found == entries.end() ? nullptr : &*found;
}

Tiff::Tiff(std::span<const std::uint8_t> bytes) : bytes_(bytes) {
  if (bytes.size() < headerSize || bytes[0] != bytes[1]) return;
  littleEndian_ = bytes[0] == 'I';
  valid_ = (littleEndian_ || bytes[0] == 'M') && read16(2) == 42;
}

std::uint16_t Tiff::read16(std::uint64_t place) const {
  const unsigned first = bytes_[place], second = bytes_[place + 1];
  return static_cast<std::uint16_t>(littleEndian_ ? second << 8 | first : first << 8 | second);
}

std::uint32_t Tiff::read32(std::uint64_t place) const {
  const std::uint32_t first = read16(place), second = read16(place + 2);
  return littleEndian_ ? second << 16 | first : first << 16 | second;
}

void EditableTiff::write16(std::uint64_t place, std::uint16_t value) {
  const auto low = static_cast<std::uint8_t>(value), high = static_cast<std::uint8_t>(value >> 8);
  bytes_[place] = littleEndian() ? low : high;
  bytes_[place + 1] = littleEndian() ? high : low;
}

void EditableTiff::write32(std::uint64_t place, std::uint32_t value) {
  const auto low = static_cast<std::uint16_t>(value),
             high = static_cast<std::uint16_t>(value >> 16);
  write16(place, littleEndian() ? low : high);
  write16(place + 2, littleEndian() ? high : low);
}

TiffDirectory Tiff::directoryAt(std::uint64_t place) const {
  TiffDirectory directory;
  if (!valid_ || place < headerSize || !holds(place, 2)) return directory;
  const std::uint64_t room = (bytes_.size() - place - 2) / entrySize;
  const std::uint64_t count = std::min<std::uint64_t>(read16(place), room);
  directory.begin = place;
  directory.end = place + 2 + count * entrySize;
  if (count == read16(place) && holds(directory.end, 4)) {
    directory.linkPlace = directory.end;
    directory.end += 4;
  }
  for (std::uint64_t i = 0; i < count; ++i) {
    const std::uint64_t at = place + 2 + i * entrySize;
    TiffEntry entry = {read16(at), read16(at + 2), read32(at + 4), at, at + 8, 0};
    entry.valueSize = sizeOfType(entry.type) * entry.count;
    if (entry.valueSize > 4) entry.valuePlace = read32(at + 8);
    if (entry.valueSize > 0 && holds(entry.valuePlace, entry.valueSize))
      directory.entries.push_back(entry);
  }
  return directory;
}

TiffDirectory Tiff::firstDirectory() const {
  return valid_ ? directoryAt(read32(4)) : TiffDirectory();
}

TiffDirectory Tiff::nextDirectory(const TiffDirectory& directory) const {
  if (directory.linkPlace == 0) return {};
  const std::uint64_t next = read32(directory.linkPlace);
  return next == directory.begin ? TiffDirectory() : directoryAt(next);
}

TiffDirectory Tiff::directoryOf(const TiffEntry* entry) const {
  if (entry == nullptr || (entry->type != longType && entry->type != directoryType)) return {};
  return directoryAt(read32(entry->valuePlace));
}

bool Tiff::isNumber(const TiffEntry& entry) {
  return entry.count > 0 && (entry.type == shortType || entry.type == longType);
}

std::uint32_t Tiff::number(const TiffEntry& entry, std::uint32_t index) const {
  return entry.type == shortType ? read16(entry.valuePlace + std::uint64_t{2} * index)
                                 : read32(entry.valuePlace + std::uint64_t{4} * index);
}

bool EditableTiff::setNumber(const TiffEntry& entry, std::uint32_t value, std::uint32_t index) {
  if (entry.type == longType) {
    write32(entry.valuePlace + std::uint64_t{4} * index, value);
    return true;
  }
  if (value > 0xFFFF) return false;
  write16(entry.valuePlace + std::uint64_t{2} * index, static_cast<std::uint16_t>(value));
  return true;
}

}  // namespace pelorin::photo
