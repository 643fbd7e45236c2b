#include "photo/jpeg/jpeg_limits.h"

#include <cstring>
#include <string>

#include "photo/checked_pixels.h"

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

// A Huffman code is a bit or more, and every block of 8 x 8 has one: what asks for more blocks than the
// file has bits would end early, after memory was taken for all of them.
void checkBlocks(const jpeg_decompress_struct& codec, std::uint64_t bytes) {
  std::uint64_t blocks = 0;
  for (const jpeg_component_info& component :
       std::span(codec.comp_info, static_cast<std::size_t>(codec.num_components))) {
    blocks += std::uint64_t{component.width_in_blocks} * component.height_in_blocks;
  }
  if (blocks > bytes * 8) {
    throw PhotoError(PhotoError::Kind::truncated, "truncated: the picture data ends early");
  }
}

}  // namespace

void checkLimits(LibjpegReader& reader, const DecodeLimits& limits) {
  jpeg_decompress_struct& codec = reader.codec();
  const PictureSize size{codec.image_width, codec.image_height};
  const std::uint64_t pixels = checkPixels(size, limits);
  // readHeader has consumed the first scan's start.
  const std::span rest(codec.src->next_input_byte, codec.src->bytes_in_buffer);
  const std::uint64_t bytes = rest.size() + reader.bytesElsewhere();
  if (codec.arith_code) {  // whose symbols take less than a bit
    checkCompressedPixels(size, bytes, limits);
  } else {
    checkBlocks(codec, bytes);
  }
  if (!jpeg_has_multiple_scans(&codec)) return;
  const int scans = 1 + countScans(rest, limits.scans);
  if (scans > limits.scans) {
    throw PhotoError(PhotoError::Kind::tooLarge,
                     "too many scans: at most " + std::to_string(limits.scans) + " can be read");
  }
  constexpr std::uint64_t perByte = 4096;
  if (pixels * static_cast<std::uint64_t>(scans) > limits.scannedPixels + perByte * rest.size()) {
    throw PhotoError(PhotoError::Kind::tooLarge, "too many scans: " + std::to_string(scans) +
                                                     " of " + std::to_string(codec.image_width) +
                                                     " x " + std::to_string(codec.image_height) +
                                                     " pixels in a file of this size");
  }
}

}  // namespace pelorin::photo
