#include "photo/metadata/exif_orientation.h"

#include <algorithm>
#include <array>

#include "photo/metadata/tiff.h"

namespace pelorin::photo {
namespace {

constexpr std::array<std::uint8_t, 6> exifMark = {'E', 'x', 'i', 'f', 0, 0};
constexpr std::uint16_t orientationTag = 0x0112, shortType = 3;

}  // namespace

bool isExif(std::span<const std::uint8_t> payload) {
  return payload.size() > exifMark.size() &&
         std::equal(exifMark.begin(), exifMark.end(), payload.begin());
}

int exifOrientation(std::span<const std::uint8_t> payload) {
  if (!isExif(payload)) return 1;
  const Tiff tiff(payload.subspan(exifMark.size()));
  for (const TiffEntry& entry : tiff.firstDirectory().entries) {
    if (entry.tag != orientationTag || entry.type != shortType || entry.count != 1) continue;
    const std::uint32_t value = tiff.number(entry);
    if (value >= 1 && value <= 8) return static_cast<int>(value);
  }
  return 1;
}

}  // namespace pelorin::photo
