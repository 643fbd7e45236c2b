// Bytes as the payload of an Exif segment: reading is safe, and after the patch the orientation is
// upright, the size the same, and a second patch changes nothing.
#include <cstdint>
#include <cstdlib>
#include <vector>

#include "photo/metadata/capture_time.h"
#include "photo/metadata/exif_orientation.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace pelorin::photo;
  // Random bytes hardly ever begin as Exif does, so the bytes also stand behind such a beginning.
  const std::vector<std::uint8_t> bytes(data, data + size);
  for (const char* beginning : {"", "II\x2A\0", "MM\0\x2A"}) {
    std::vector<std::uint8_t> payload;
    if (*beginning != '\0') {
      payload = {'E', 'x', 'i', 'f', 0, 0};
      payload.insert(payload.end(), beginning, beginning + 4);
      // The first directory follows at once.
      const std::vector<std::uint8_t> offset = *beginning == 'I'
                                                   ? std::vector<std::uint8_t>{8, 0, 0, 0}
                                                   : std::vector<std::uint8_t>{0, 0, 0, 8};
      payload.insert(payload.end(), offset.begin(), offset.end());
    }
    payload.insert(payload.end(), bytes.begin(), bytes.end());

    const int orientation = exifOrientation(payload);
    if (orientation < 1 || orientation > 8) std::abort();
    exifCaptureTime(payload);
    std::vector<std::uint8_t> upright = payload;
    setExifOrientationUpright(upright);
    if (exifOrientation(upright) != 1) std::abort();
    if (orientation != 1 && upright == payload) std::abort();
    std::vector<std::uint8_t> again = upright;
    setExifOrientationUpright(again);
    if (again != upright) std::abort();
  }
  return 0;
}
