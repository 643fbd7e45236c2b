// Bytes as a TIFF file: whatever its directories say lies within it, chains end, and a number that was written
// is the one that is read.
#include <cstdint>
#include <cstdlib>
#include <set>
#include <vector>

#include "photo/metadata/tiff.h"

using namespace pelorin::photo;

namespace {

void check(bool holds) {
  if (!holds) std::abort();
}

void checkDirectory(EditableTiff& tiff, const TiffDirectory& directory, int depth) {
  check(directory.begin <= directory.end && directory.end <= tiff.size());
  check(directory.linkPlace == 0 || tiff.holds(directory.linkPlace, 4));
  for (const TiffEntry& entry : directory.entries) {
    check(tiff.holds(entry.place, 12) && tiff.holds(entry.valuePlace, entry.valueSize));
    check(entry.valueSize > 0);
    check(directory.find(entry.tag) != nullptr && directory.find(entry.tag)->tag == entry.tag);
    if (depth > 0) checkDirectory(tiff, tiff.directoryOf(&entry), depth - 1);
    if (!Tiff::isNumber(entry)) continue;
    const std::uint32_t last = entry.count - 1, before = tiff.number(entry, last);
    const std::uint32_t other = ~before;
    const bool fits = tiff.setNumber(entry, other, last);
    check(tiff.number(entry, last) == (fits ? other : before));
    check(tiff.setNumber(entry, before, last) && tiff.number(entry, last) == before);
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  // Random bytes hardly ever begin as TIFF does, so they also stand behind such a beginning.
  for (const char* const beginning : {"", "II\x2A\0\x08\0\0\0", "MM\0\x2A\0\0\0\x08"}) {
    std::vector<std::uint8_t> bytes;
    if (*beginning != '\0') bytes.assign(beginning, beginning + 8);
    bytes.insert(bytes.end(), data, data + size);
    const std::vector<std::uint8_t> before = bytes;
    EditableTiff tiff(bytes);
    check(*beginning == '\0' || tiff.valid());
    TiffDirectory directory = tiff.firstDirectory();
    std::set<std::uint64_t> seen;
    while (directory.begin != 0 && seen.insert(directory.begin).second) {
      checkDirectory(tiff, directory, 2);
      directory = tiff.nextDirectory(directory);
    }
    check(tiff.directoryOf(nullptr).entries.empty());
    check(bytes == before);
  }
  return 0;
}
