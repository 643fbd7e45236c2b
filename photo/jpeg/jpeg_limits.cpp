#include "photo/jpeg/jpeg_limits.h"

#include <cstring>
#include <string>

namespace pelorin::photo {
namespace {

constexpr std::uint8_t markerPrefix = 0xFF, endOfImage = 0xD9, startOfScan = 0xDA;

// Stuffed zeros and restart marks are part of the picture data, not the start of a segment.
bool isWithinPictureData(std::uint8_t marker) {
  constexpr std::uint8_t stuffing = 0x00, temporary = 0x01, firstRestart = 0xD0, lastRestart = 0xD7;
  return marker == stuffing || marker == temporary ||
         (marker >= firstRestart && marker <= lastRestart);
}

// How many scans begin in `bytes`, which start with picture data; counts no further than `enough`.
int countScans(std::span<const std::uint8_t> bytes, int enough) {
  int scans = 0;
  while (scans < enough && !bytes.empty()) {
    const void* found = std::memchr(bytes.data(), markerPrefix, bytes.size());
    if (found == nullptr) break;
    bytes = bytes.subspan(static_cast<const std::uint8_t*>(found) - bytes.data());
    while (!bytes.empty() && bytes.front() == markerPrefix) bytes = bytes.subspan(1);
    if (bytes.empty() || bytes.front() == endOfImage) break;
    if (!isWithinPictureData(bytes.front())) {
      if (bytes.front() == startOfScan) ++scans;
      if (bytes.size() < 3) break;
      const std::size_t length = bytes[1] * 256u + bytes[2];
      if (length + 1 > bytes.size()) break;
      bytes = bytes.subspan(length);
    }
    bytes = bytes.subspan(1);
  }
  return scans;
}

}  // namespace

void checkLimits(LibjpegReader& reader, const DecodeLimits& limits) {
  jpeg_decompress_struct& codec = reader.codec();
  const std::uint64_t pixels = std::uint64_t{codec.image_width} * codec.image_height;
  if (pixels > limits.pixels) {
    throw PhotoError(PhotoError::Kind::tooLarge,
                     "too large: " + std::to_string(codec.image_width) + " x " +
                         std::to_string(codec.image_height) + " pixels, at most " +
                         std::to_string(limits.pixels) + " can be read");
  }
  if (!jpeg_has_multiple_scans(&codec)) return;
  // readHeader has consumed the first scan's start.
  const std::span rest(codec.src->next_input_byte, codec.src->bytes_in_buffer);
  if (1 + countScans(rest, limits.scans) > limits.scans) {
    throw PhotoError(PhotoError::Kind::tooLarge,
                     "too many scans: at most " + std::to_string(limits.scans) + " can be read");
  }
}

}  // namespace pelorin::photo
