#include "photo/metadata/exif_orientation.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <vector>

namespace pelorin::photo {
namespace {

constexpr std::array<std::uint8_t, 6> exifMark = {'E', 'x', 'i', 'f', 0, 0};
constexpr std::uint16_t orientationTag = 0x0112, shortType = 3;
constexpr std::size_t entrySize = 12;

// The TIFF file inside an Exif segment: every read is checked against its end.
class Tiff {
 public:
  explicit Tiff(std::span<const std::uint8_t> bytes) : bytes_(bytes) {
    littleEndian_ = bytes.size() >= 8 && bytes[0] == 'I' && bytes[1] == 'I';
    const bool bigEndian = bytes.size() >= 8 && bytes[0] == 'M' && bytes[1] == 'M';
    valid_ = (littleEndian_ || bigEndian) && read16(2) == 42;
  }

  bool valid() const { return valid_; }
  std::size_t size() const { return bytes_.size(); }
  bool littleEndian() const { return littleEndian_; }

  std::uint16_t read16(std::size_t at) const {
    const unsigned first = bytes_[at], second = bytes_[at + 1];
    return static_cast<std::uint16_t>(littleEndian_ ? second << 8 | first : first << 8 | second);
  }
  std::uint32_t read32(std::size_t at) const {
    const std::uint32_t first = read16(at), second = read16(at + 2);
    return littleEndian_ ? second << 16 | first : first << 16 | second;
  }

 private:
  std::span<const std::uint8_t> bytes_;
  bool littleEndian_ = false;
  bool valid_ = false;
};

// Where in the payload the first directory holds a valid orientation; more than one place only in a
// malformed file. A value stands left-aligned in its four bytes.
std::vector<std::size_t> orientationPlaces(const Tiff& tiff) {
  std::vector<std::size_t> places;
  if (!tiff.valid()) return places;
  const std::size_t directory = tiff.read32(4);
  if (directory > tiff.size() - 2) return places;
  const std::size_t room = (tiff.size() - directory - 2) / entrySize;
  const std::size_t entries = std::min<std::size_t>(tiff.read16(directory), room);
  for (std::size_t i = 0; i < entries; ++i) {
    const std::size_t entry = directory + 2 + i * entrySize;
    if (tiff.read16(entry) != orientationTag || tiff.read16(entry + 2) != shortType ||
        tiff.read32(entry + 4) != 1) {
      continue;
    }
    const std::uint16_t value = tiff.read16(entry + 8);
    if (value >= 1 && value <= 8) places.push_back(entry + 8);
  }
  return places;
}

}  // namespace

bool isExif(std::span<const std::uint8_t> payload) {
  return payload.size() > exifMark.size() &&
         std::equal(exifMark.begin(), exifMark.end(), payload.begin());
}

int exifOrientation(std::span<const std::uint8_t> payload) {
  if (!isExif(payload)) return 1;
  const Tiff tiff(payload.subspan(exifMark.size()));
  const std::vector<std::size_t> places = orientationPlaces(tiff);
  return places.empty() ? 1 : tiff.read16(places[0]);
}

void setExifOrientationUpright(std::span<std::uint8_t> payload) {
  if (!isExif(payload)) return;
  const std::span<std::uint8_t> bytes = payload.subspan(exifMark.size());
  const Tiff tiff(bytes);
  for (const std::size_t place : orientationPlaces(tiff)) {
    bytes[place] = tiff.littleEndian() ? 1 : 0;
    bytes[place + 1] = tiff.littleEndian() ? 0 : 1;
  }
}

}  // namespace pelorin::photo
