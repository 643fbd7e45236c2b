// The reader of PNG files on any bytes: the bytes as a file, and a good file with some of its bytes
// changed and its checksums made good, which gets further. Every picture that comes out can be
// written with its metadata and gives the same pixels again.
#include <zlib.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "photo/photo.h"

namespace {

using namespace pelorin;
using Bytes = std::vector<std::uint8_t>;

constexpr photo::DecodeLimits limits = {.pixels = 1 << 18, .scans = 20};

void check(bool holds) {
  if (!holds) std::abort();
}

void readEveryWay(const Bytes& file) {
  try {
    const photo::Photo read = photo::open(file, {.upright = false, .limits = limits});
    check(read.image->width == read.facts.width && read.image->height == read.facts.height);
    photo::Metadata metadata = read.metadata;
    metadata.orientation = 1;
    const photo::Photo again =
        photo::open(photo::save(*read.image, "PNG", metadata), {.upright = false});
    check(again.image->byteSize() == read.image->byteSize());
    check(std::memcmp(again.image->data.get(), read.image->data.get(), read.image->byteSize()) ==
          0);
    photo::open(file, {.scale = 4, .limits = limits});
  } catch (const photo::PhotoError&) {
  }
}

const Bytes& goodFile() {
  static const Bytes file = [] {
    image_processing::Image<image_processing::RGBA8Pixel> picture(40, 24);
    for (std::size_t i = 0; i < picture.pixelCount(); ++i) {
      const auto v = static_cast<std::uint8_t>(i * i / 7);
      picture.data.get()[i] = {v, static_cast<std::uint8_t>(v * 3), 9, v};
    }
    photo::Metadata metadata;
    metadata.chunks = {{"tEXt", {'a', 0, 'b'}}, {"pHYs", {0, 0, 1, 0, 0, 0, 1, 0, 1}}};
    metadata.segments = {{0xE1, {'E', 'x', 'i', 'f', 0, 0, 'I', 'I', 42, 0, 8, 0, 0, 0, 0, 0}}};
    return photo::save(picture, "PNG", metadata);
  }();
  return file;
}

void mendChecksums(Bytes& file) {
  for (std::size_t at = 8; at + 12 <= file.size();) {
    const std::size_t length = std::size_t{file[at]} << 24 | std::size_t{file[at + 1]} << 16 |
                               std::size_t{file[at + 2]} << 8 | file[at + 3];
    if (length > file.size() - at - 12) return;
    const auto sum = crc32(0, file.data() + at + 4, static_cast<uInt>(length + 4));
    for (int i = 0; i < 4; ++i)
      file[at + 8 + length + i] = static_cast<std::uint8_t>(sum >> (24 - 8 * i));
    at += 12 + length;
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  readEveryWay({data, data + size});
  Bytes changed = goodFile();
  constexpr std::size_t mostChanges = 6;
  for (std::size_t i = 0; i + 3 <= size && i < mostChanges * 3; i += 3)
    changed[(data[i] * 256u + data[i + 1]) % changed.size()] = data[i + 2];
  mendChecksums(changed);
  readEveryWay(changed);
  return 0;
}
