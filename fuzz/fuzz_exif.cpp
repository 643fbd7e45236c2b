// Bytes as the payload of an Exif segment: reading and editing are safe, and afterwards it states an
// upright picture and fits a segment.
#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <vector>

#include "photo/metadata/capture_time.h"
#include "photo/metadata/exif_edit.h"
#include "photo/metadata/exif_orientation.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace pelorin::photo;
  constexpr std::size_t longestPayload = 65533;
  constexpr PictureChange change = {{40, 30}, {15, 20}, {false, 1}, 6};
  static const pelorin::image_processing::Image<pelorin::image_processing::RGBA8Pixel> picture(15,
                                                                                               20);
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
    std::vector<std::uint8_t> edited = payload;
    removeExifLocation(edited);
    if (edited.size() != payload.size()) std::abort();
    ThumbnailMaker thumbnails(picture);
    std::vector<Loss> lost;
    editExif(edited, change, &thumbnails, lost);
    if (exifOrientation(edited) != 1 || edited.size() > std::max(payload.size(), longestPayload))
      std::abort();
  }
  return 0;
}
