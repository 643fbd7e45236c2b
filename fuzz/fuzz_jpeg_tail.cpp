// Bytes as what stands behind the picture in a JPEG file, and as an index of its pictures: reading is
// safe, parts lie within the bytes and in their order, an index that is written reads as it was, and
// Samsung's trailer holds pictures where one of its blocks is one.
#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <string_view>
#include <vector>

#include "photo/jpeg/jpeg_end.h"
#include "photo/metadata/jpeg_tail.h"
#include "photo/metadata/kept_metadata.h"
#include "photo/metadata/mpf.h"

namespace {

using namespace pelorin::photo;

void readTailOf(const std::vector<std::uint8_t>& bytes) {
  auto place = bytes.begin();
  for (const TailPart& part : readTail(bytes)) {
    if (part.bytes.empty()) std::abort();
    place = std::search(place, bytes.end(), part.bytes.begin(), part.bytes.end());
    if (place == bytes.end()) std::abort();
    place += static_cast<std::ptrdiff_t>(part.bytes.size());
  }
  if (jpegEnd(bytes) > bytes.size()) std::abort();
}

void putLittle(std::vector<std::uint8_t>& bytes, std::size_t value) {
  for (int shift = 0; shift < 32; shift += 8)
    bytes.push_back(static_cast<std::uint8_t>(value >> shift));
}

void put(std::vector<std::uint8_t>& bytes, std::string_view text) {
  bytes.insert(bytes.end(), text.begin(), text.end());
}

// The bytes as a block, and as the table of blocks.
void readSamsung(const std::vector<std::uint8_t>& bytes) {
  constexpr std::string_view jpeg = "\xFF\xD8\xFF";
  for (const std::string_view beginning : {std::string_view(), jpeg}) {
    std::vector<std::uint8_t> trailer = {0, 0, 0x30, 0x0A};
    putLittle(trailer, 1);
    put(trailer, "n");
    put(trailer, beginning);
    trailer.insert(trailer.end(), bytes.begin(), bytes.end());
    const std::size_t size = trailer.size();
    put(trailer, "SEFH");
    for (const std::size_t number : {106u, 1u, 0x0A300000u}) putLittle(trailer, number);
    putLittle(trailer, size), putLittle(trailer, size);
    putLittle(trailer, 24);
    put(trailer, "SEFT");
    const bool isPicture = !beginning.empty() || (bytes.size() >= 3 && bytes[0] == 0xFF &&
                                                  bytes[1] == 0xD8 && bytes[2] == 0xFF);
    if (samsungHoldsPictures(trailer) != isPicture) std::abort();
  }
  std::vector<std::uint8_t> trailer = bytes;
  put(trailer, "SEFH");
  trailer.insert(trailer.end(), bytes.begin(), bytes.end());
  putLittle(trailer, bytes.size() + 4);
  put(trailer, "SEFT");
  samsungHoldsPictures(trailer);
  samsungHoldsPictures(bytes);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::vector<std::uint8_t> bytes(data, data + size);
  readTailOf(bytes);
  readSamsung(bytes);
  for (const char* mark : {"\xFF\xD8\xFF\xDA", "SEFT", "cbipcbbl", "\xA1\xB2\xC3\xD4", "ftyp"}) {
    std::vector<std::uint8_t> marked = bytes;
    const std::string_view text = mark;
    marked.insert(marked.end(), text.begin(), text.end());
    readTailOf(marked);
    std::rotate(marked.begin(), marked.end() - static_cast<std::ptrdiff_t>(text.size()),
                marked.end());
    readTailOf(marked);
  }

  std::vector<std::uint8_t> index = {'M', 'P', 'F', 0};
  index.insert(index.end(), bytes.begin(), bytes.end());
  const std::vector<MpfEntry> entries = readMpf(index);
  const std::vector<MpfEntry> again = readMpf(writeMpf(entries));
  if (again.size() != entries.size()) std::abort();
  for (std::size_t i = 0; i < entries.size(); ++i) {
    if (again[i].attributes != entries[i].attributes || again[i].size != entries[i].size ||
        again[i].offset != entries[i].offset)
      std::abort();
  }

  std::vector<std::uint8_t> file(2 + bytes.size());
  file[0] = 0xFF, file[1] = 0xD8;
  std::copy(bytes.begin(), bytes.end(), file.begin() + 2);
  const std::size_t before = file.size();
  appendTail(file, {{TailPart::Kind::gainMap, {1, 2, 3}}});
  if (file.size() != before + 3) std::abort();
  return 0;
}
