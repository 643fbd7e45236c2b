#include "tests/cli/jpeg_files.h"

#include <stdio.h>
#include <stdlib.h>

// After stdio.h, which it needs.
#include <jpeglib.h>

#include <cstring>
#include <stdexcept>
#include <utility>

#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

// A libjpeg compressor into memory that is set up by the caller.
class Compressor {
 public:
  Compressor(std::uint32_t width, std::uint32_t height, int components, J_COLOR_SPACE space) {
    info.err = jpeg_std_error(&errors_);
    jpeg_create_compress(&info);
    jpeg_mem_dest(&info, &bytes_, &size_);
    info.image_width = width;
    info.image_height = height;
    info.input_components = components;
    info.in_color_space = space;
    jpeg_set_defaults(&info);
  }
  ~Compressor() {
    jpeg_destroy_compress(&info);
    free(bytes_);
  }
  Bytes finish() {
    jpeg_finish_compress(&info);
    return Bytes(bytes_, bytes_ + size_);
  }

  jpeg_compress_struct info = {};

 private:
  jpeg_error_mgr errors_ = {};
  unsigned char* bytes_ = nullptr;
  unsigned long size_ = 0;
};

void writeNoise(jpeg_compress_struct& info) {
  Random random(3);
  Bytes row(std::size_t{info.image_width} * info.input_components);
  while (info.next_scanline < info.image_height) {
    for (std::uint8_t& sample : row) sample = static_cast<std::uint8_t>(random.below(256));
    JSAMPROW samples = row.data();
    jpeg_write_scanlines(&info, &samples, 1);
  }
}

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

Bytes jpegOf(const Image<RGBA8Pixel>& picture, const std::vector<photo::MetadataSegment>& metadata,
             int quality) {
  return photo::encodeJpeg(reinterpret_cast<const std::uint8_t*>(picture.data.get()), picture.width,
                           picture.height, quality, metadata);
}

Bytes smallJpeg(std::uint64_t seed) {
  return jpegOf(photoLikePicture(48, 32, seed));
}

Bytes cmykJpeg(std::uint32_t width, std::uint32_t height,
               const std::vector<photo::MetadataSegment>& metadata) {
  Compressor compressor(width, height, 4, JCS_CMYK);
  jpeg_start_compress(&compressor.info, TRUE);
  for (const photo::MetadataSegment& segment : metadata) {
    jpeg_write_marker(&compressor.info, segment.marker, segment.payload.data(),
                      static_cast<unsigned>(segment.payload.size()));
  }
  writeNoise(compressor.info);
  return compressor.finish();
}

Bytes jpegOf505Scans() {
  constexpr int topBit = 7;
  std::vector<jpeg_scan_info> scans;
  const auto addScan = [&scans](int coefficient, int from, int to) {
    jpeg_scan_info scan = {};
    scan.comps_in_scan = 1;
    scan.Ss = scan.Se = coefficient;
    scan.Ah = from;
    scan.Al = to;
    scans.push_back(scan);
  };
  addScan(0, 0, 0);
  for (int coefficient = 1; coefficient < 64; ++coefficient) {
    addScan(coefficient, 0, topBit);
    for (int bit = topBit; bit > 0; --bit) addScan(coefficient, bit, bit - 1);
  }
  Compressor compressor(16, 16, 1, JCS_GRAYSCALE);
  compressor.info.scan_info = scans.data();
  compressor.info.num_scans = static_cast<int>(scans.size());
  jpeg_start_compress(&compressor.info, TRUE);
  writeNoise(compressor.info);
  return compressor.finish();
}

Bytes withHeaderSize(Bytes file, std::uint16_t width, std::uint16_t height) {
  for (std::size_t at = 2; at + 9 < file.size();) {
    const std::uint8_t marker = file[at + 1];
    if (marker >= 0xC0 && marker <= 0xC2) {
      file[at + 5] = static_cast<std::uint8_t>(height >> 8);
      file[at + 6] = static_cast<std::uint8_t>(height);
      file[at + 7] = static_cast<std::uint8_t>(width >> 8);
      file[at + 8] = static_cast<std::uint8_t>(width);
      return file;
    }
    at += 2 + (std::size_t{file[at + 2]} << 8) + file[at + 3];
  }
  throw std::runtime_error("no frame header");
}

Image<RGBA8Pixel> decoded(const Bytes& file) {
  const photo::DecodedPicture picture = photo::decodeJpeg(file);
  Image<RGBA8Pixel> image(picture.width, picture.height);
  std::memcpy(image.data.get(), picture.pixels.get(), image.byteSize());
  return image;
}

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
