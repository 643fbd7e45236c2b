#include "tests/support/exif_payload.h"

#include <utility>

namespace pelorin::test_support {
namespace {

// A TIFF file under construction, in one byte order.
class TiffWriter {
 public:
  explicit TiffWriter(bool littleEndian) : littleEndian_(littleEndian) {}

  void put16(std::uint32_t value) { put(value, 2); }
  void put32(std::uint32_t value) { put(value, 4); }
  void putEntry(std::uint32_t tag, std::uint32_t type, std::uint32_t count, std::uint32_t value) {
    put16(tag);
    put16(type);
    put32(count);
    if (type == 3) {
      put16(value);
      put16(0);
    } else {
      put32(value);
    }
  }
  void putText(const std::string& text) {
    bytes.insert(bytes.end(), text.begin(), text.end());
    bytes.push_back(0);
  }

  Bytes bytes;

 private:
  void put(std::uint32_t value, int size) {
    for (int i = 0; i < size; ++i) {
      const int shift = 8 * (littleEndian_ ? i : size - 1 - i);
      bytes.push_back(static_cast<std::uint8_t>(value >> shift));
    }
  }

  bool littleEndian_;
};

}  // namespace

Bytes exifPayload(const ExifFields& fields, bool littleEndian) {
  const bool hasOrientation = fields.orientation != 0;
  std::vector<std::pair<std::uint32_t, std::string>> texts;
  if (!fields.dateTime.empty()) texts.emplace_back(0x9003, fields.dateTime);
  if (!fields.offset.empty()) texts.emplace_back(0x9011, fields.offset);
  if (!fields.subSeconds.empty()) texts.emplace_back(0x9291, fields.subSeconds);

  // Header, first directory, Exif directory, then the texts that need more than four bytes.
  const std::uint32_t firstDirectory = 8;
  const std::uint32_t entries = (hasOrientation ? 1 : 0) + (texts.empty() ? 0 : 1);
  const std::uint32_t exifDirectory = firstDirectory + 2 + 12 * entries + 4;
  std::uint32_t free = exifDirectory + 2 + 12 * static_cast<std::uint32_t>(texts.size()) + 4;

  TiffWriter tiff(littleEndian);
  tiff.bytes = Bytes(2, littleEndian ? 'I' : 'M');
  tiff.put16(42);
  tiff.put32(firstDirectory);
  tiff.put16(entries);
  if (hasOrientation) tiff.putEntry(0x0112, 3, 1, static_cast<std::uint32_t>(fields.orientation));
  if (!texts.empty()) tiff.putEntry(0x8769, 4, 1, exifDirectory);
  tiff.put32(0);
  if (!texts.empty()) {
    TiffWriter tail(littleEndian);
    tiff.put16(static_cast<std::uint32_t>(texts.size()));
    for (const auto& [tag, text] : texts) {
      const auto size = static_cast<std::uint32_t>(text.size() + 1);
      if (size <= 4) {
        tiff.put16(tag);
        tiff.put16(2);
        tiff.put32(size);
        for (std::size_t i = 0; i < 4; ++i) {
          tiff.bytes.push_back(i < text.size() ? static_cast<std::uint8_t>(text[i]) : 0);
        }
        continue;
      }
      tiff.putEntry(tag, 2, size, free);
      tail.putText(text);
      free += size;
    }
    tiff.put32(0);
    tiff.bytes.insert(tiff.bytes.end(), tail.bytes.begin(), tail.bytes.end());
  }
  const std::string mark("Exif\0\0", 6);
  tiff.bytes.insert(tiff.bytes.begin(), mark.begin(), mark.end());
  return tiff.bytes;
}

}  // namespace pelorin::test_support
