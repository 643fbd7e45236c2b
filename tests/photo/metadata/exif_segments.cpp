#include "tests/photo/metadata/exif_segments.h"

#include <algorithm>

namespace pelorin::test_support {
namespace {

class Writer {
 public:
  explicit Writer(bool littleEndian) : littleEndian_(littleEndian) {
    bytes = littleEndian ? Bytes{'I', 'I'} : Bytes{'M', 'M'};
    put(42, 2);
    put(8, 4);
  }

  void put(std::uint32_t value, int size) {
    for (int i = 0; i < size; ++i)
      bytes.push_back(static_cast<std::uint8_t>(value >> 8 * (littleEndian_ ? i : size - 1 - i)));
  }
  void putAt(std::size_t place, std::uint32_t value) {
    for (int i = 0; i < 4; ++i)
      bytes[place + i] = static_cast<std::uint8_t>(value >> 8 * (littleEndian_ ? i : 3 - i));
  }
  void shortEntry(std::uint32_t tag, std::uint32_t value) {
    put(tag, 2), put(3, 2), put(1, 4), put(value, 2), put(0, 2);
  }
  void longEntry(std::uint32_t tag, std::uint32_t value) {
    put(tag, 2), put(4, 2), put(1, 4), put(value, 4);
  }
  // An entry whose value comes later: @returns where its place is to be written.
  std::size_t laterEntry(std::uint32_t tag, std::uint32_t type, std::size_t count) {
    put(tag, 2), put(type, 2), put(static_cast<std::uint32_t>(count), 4), put(0, 4);
    return bytes.size() - 4;
  }
  void putHere(std::size_t place) { putAt(place, static_cast<std::uint32_t>(bytes.size())); }
  void putAll(const Bytes& more) { bytes.insert(bytes.end(), more.begin(), more.end()); }

  Bytes bytes;

 private:
  bool littleEndian_;
};

}  // namespace

Bytes cameraExif(const CameraExif& fields) {
  Writer tiff(fields.littleEndian);
  tiff.put(4, 2);
  tiff.longEntry(0x0100, fields.width);
  tiff.longEntry(0x0101, fields.height);
  tiff.shortEntry(0x0112, static_cast<std::uint32_t>(fields.orientation));
  const std::size_t exif = tiff.laterEntry(0x8769, 4, 1);
  tiff.put(0, 4);
  const std::size_t link = tiff.bytes.size() - 4;

  tiff.putHere(exif);
  const bool subject = !fields.subjectArea.empty();
  tiff.put(subject ? 5 : 4, 2);
  const std::size_t area = subject ? tiff.laterEntry(0x9214, 3, fields.subjectArea.size()) : 0;
  const std::size_t note = tiff.laterEntry(0x927C, 7, fields.makerNote.size());
  tiff.shortEntry(0xA002, fields.width);
  tiff.shortEntry(0xA003, fields.height);
  tiff.longEntry(0xEEEE, 0xDEADBEEF);
  tiff.put(0, 4);
  if (subject) {
    Writer value(fields.littleEndian);
    value.bytes.clear();
    for (const std::uint16_t number : fields.subjectArea) value.put(number, 2);
    if (value.bytes.size() <= 4) {
      std::copy(value.bytes.begin(), value.bytes.end(),
                tiff.bytes.begin() + static_cast<std::ptrdiff_t>(area));
    } else {
      tiff.putHere(area);
      tiff.putAll(value.bytes);
    }
  }
  if (!fields.noteBehindThumbnail) {
    tiff.putHere(note);
    tiff.putAll(fields.makerNote);
  }
  if (!fields.thumbnail.empty()) {
    tiff.putHere(link);
    tiff.put(4, 2);
    tiff.shortEntry(0x0103, 6);
    tiff.shortEntry(0x0112, static_cast<std::uint32_t>(fields.orientation));
    const std::size_t offset = tiff.laterEntry(0x0201, 4, 1);
    tiff.longEntry(0x0202, static_cast<std::uint32_t>(fields.thumbnail.size()));
    tiff.put(0, 4);
    tiff.putHere(offset);
    tiff.putAll(fields.thumbnail);
  }
  if (fields.noteBehindThumbnail) {
    tiff.putHere(note);
    tiff.putAll(fields.makerNote);
  }
  const Bytes mark = {'E', 'x', 'i', 'f', 0, 0};
  tiff.bytes.insert(tiff.bytes.begin(), mark.begin(), mark.end());
  return tiff.bytes;
}

}  // namespace pelorin::test_support
