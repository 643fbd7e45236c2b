#include "photo/jpeg/jpeg_end.h"

#include <algorithm>
#include <cstring>
#include <vector>

namespace pelorin::photo {
namespace {

constexpr std::uint8_t startOfImage = 0xD8, endOfImage = 0xD9, startOfScan = 0xDA;

bool hasStartMark(std::span<const std::uint8_t> bytes) {
  return bytes.size() >= 2 && bytes[0] == 0xFF && bytes[1] == startOfImage;
}

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
  if (!hasStartMark(bytes)) return 0;
  std::size_t at = 2;
  while ((at = nextMarker(bytes, at)) < bytes.size()) {
    const std::uint8_t marker = bytes[at + 1];
    if (marker == endOfImage) return at + 2;
    if (bytes.size() - at < 4) break;
    at += 2 + (std::size_t{bytes[at + 2]} << 8 | bytes[at + 3]);
  }
  return bytes.size();
}

std::uint64_t jpegEndIn(const FileView& file) {
  if (file.rest == nullptr) return jpegEnd(file.bytes);
  if (!hasStartMark(file.bytes)) return 0;
  constexpr std::uint64_t windowSize = std::uint64_t{1} << 18;
  constexpr std::size_t markerAndLength = 4;
  const std::uint64_t size = file.size();
  std::vector<std::uint8_t> window;
  std::uint64_t begin = 0;
  const auto moveTo = [&](std::uint64_t place) {
    begin = place;
    window.resize(static_cast<std::size_t>(std::min(windowSize, size - place)));
    readFrom(file, place, window);
  };
  moveTo(2);
  for (std::size_t at = 0;;) {
    at = nextMarker(window, at);
    if (window.size() - at < markerAndLength && begin + window.size() < size) {
      // Cut off, or none; the last byte may begin one.
      moveTo(begin + std::min(at, window.size() - 1));
      at = 0;
      continue;
    }
    if (at == window.size()) return size;
    if (window[at + 1] == endOfImage) return begin + at + 2;
    if (window.size() - at < markerAndLength) return size;
    at += 2 + (std::size_t{window[at + 2]} << 8 | window[at + 3]);
    if (at < window.size()) continue;
    if (begin + at >= size) return size;
    moveTo(begin + at);
    at = 0;
  }
}

bool beginsPlainJpeg(std::span<const std::uint8_t> bytes) {
  if (!hasStartMark(bytes)) return false;
  constexpr std::uint8_t baseline = 0xC0, extended = 0xC1, huffmanTables = 0xC4, lastFrame = 0xCF;
  constexpr std::size_t channelsPlace = 9;  // in a frame
  std::uint8_t channels = 0;
  for (std::size_t at = 2; (at = nextMarker(bytes, at)) < bytes.size();) {
    const std::uint8_t marker = bytes[at + 1];
    if (marker == endOfImage || bytes.size() - at < 4) return false;
    const std::size_t length = 2 + (std::size_t{bytes[at + 2]} << 8 | bytes[at + 3]);
    if (length <= channelsPlace || length > bytes.size() - at) {
      if (length > bytes.size() - at || marker <= extended) return false;
    } else if (marker == baseline || marker == extended) {
      channels = bytes[at + channelsPlace];
    } else if (marker > extended && marker <= lastFrame && marker != huffmanTables) {
      return false;
    }
    if (marker == startOfScan) return length > 4 && channels > 0 && bytes[at + 4] == channels;
    at += length;
  }
  return false;
}

bool hasMoreSegments(std::span<const std::uint8_t> bytes, std::size_t most) {
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
