// Every reader of JPEG files on any bytes: the bytes as a file, and a good file with some of its
// bytes changed, which gets further.
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <vector>

#include "photo/jpeg/jpeg_codec.h"

namespace {

using namespace pelorin::photo;

constexpr DecodeLimits limits = {.pixels = 1 << 18, .scans = 20};

void check(bool holds) {
  if (!holds) std::abort();
}

void readEveryWay(const std::vector<std::uint8_t>& file, int scale) {
  try {
    const JpegHeader header = readJpegHeader(file);
    const DecodedPicture picture = decodeJpeg(file, scale, limits);
    check(picture.width <= header.width && picture.height <= header.height);
    const std::size_t count = std::size_t{picture.width} * picture.height;
    for (std::size_t i = 0; i < count; ++i) check(picture.pixels.get()[i * 4 + 3] == 255);
  } catch (const PhotoError&) {
  }
  for (const int degrees : {0, 90, 180}) {
    try {
      readJpegHeader(rotateJpeg(file, degrees, limits));
    } catch (const PhotoError&) {
    }
  }
}

const std::vector<std::uint8_t>& goodFile() {
  static const std::vector<std::uint8_t> file = [] {
    constexpr std::uint32_t width = 40, height = 24;
    std::vector<std::uint8_t> pixels;
    for (std::uint32_t i = 0; i < width * height * 4; ++i) {
      pixels.push_back(static_cast<std::uint8_t>(i * i / 7));
    }
    return encodeJpeg(pixels.data(), width, height, /*quality=*/60);
  }();
  return file;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::vector<std::uint8_t> bytes(data, data + size);
  const int scale = bytes.empty() ? 1 : bytes[0] % 9;
  readEveryWay(bytes, scale);

  std::vector<std::uint8_t> changed = goodFile();
  constexpr std::size_t mostChanges = 6;
  for (std::size_t i = 0; i + 3 <= size && i < mostChanges * 3; i += 3) {
    changed[(bytes[i] * 256u + bytes[i + 1]) % changed.size()] = bytes[i + 2];
  }
  readEveryWay(changed, scale);
  return 0;
}
