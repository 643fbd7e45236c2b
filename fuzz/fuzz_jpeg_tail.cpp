// Bytes as what stands behind the picture in a JPEG file, and as an index of its pictures: reading is
// safe, parts lie within the bytes and in their order, and an index that is written reads as it was.
#include <algorithm>
#include <cstdint>
#include <cstdlib>
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

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::vector<std::uint8_t> bytes(data, data + size);
  readTailOf(bytes);
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

  std::vector<std::uint8_t> file = {0xFF, 0xD8};
  file.insert(file.end(), bytes.begin(), bytes.end());
  const std::size_t before = file.size();
  appendTail(file, {{TailPart::Kind::gainMap, {1, 2, 3}}});
  if (file.size() != before + 3) std::abort();
  return 0;
}
