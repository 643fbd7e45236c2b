#include "photo/jpeg/jpeg_end.h"

#include <cstring>

namespace pelorin::photo {
namespace {

constexpr std::uint8_t startOfImage = 0xD8, endOfImage = 0xD9;

bool isBare(std::uint8_t marker) {
  return marker == 0x01 || (marker >= 0xD0 && marker <= startOfImage);
}

// The next marker at or behind a place in picture data; stuffed zeros and restarts belong to the
// data.
std::size_t nextMarker(std::span<const std::uint8_t> bytes, std::size_t at) {
  while (at + 1 < bytes.size()) {
    const void* found = std::memchr(bytes.data() + at, 0xFF, bytes.size() - at - 1);
    if (found == nullptr) break;
    at = static_cast<std::size_t>(static_cast<const std::uint8_t*>(found) - bytes.data());
    const std::uint8_t marker = bytes[at + 1];
    if (marker != 0 && marker != 0xFF && !isBare(marker)) return at;
    at += marker == 0xFF ? 1 : 2;
  }
  return bytes.size();
}

}  // namespace

std::size_t jpegEnd(std::span<const std::uint8_t> bytes) {
  if (bytes.size() < 2 || bytes[0] != 0xFF || bytes[1] != startOfImage) return 0;
  std::size_t at = 2;
  while ((at = nextMarker(bytes, at)) < bytes.size()) {
    const std::uint8_t marker = bytes[at + 1];
    if (marker == endOfImage) return at + 2;
    if (bytes.size() - at < 4) break;
    at += 2 + (std::size_t{bytes[at + 2]} << 8 | bytes[at + 3]);
  }
  return bytes.size();
}

bool hasMoreSegments(std::span<const std::uint8_t> bytes, std::size_t most) {
  constexpr std::uint8_t startOfScan = 0xDA;
  std::size_t at = 2;
  for (std::size_t count = 0; (at = nextMarker(bytes, at)) < bytes.size(); ++count) {
    const std::uint8_t marker = bytes[at + 1];
    if (marker == startOfScan || marker == endOfImage || bytes.size() - at < 4) break;
    if (count == most) return true;
    at += 2 + (std::size_t{bytes[at + 2]} << 8 | bytes[at + 3]);
  }
  return false;
}

}  // namespace pelorin::photo
