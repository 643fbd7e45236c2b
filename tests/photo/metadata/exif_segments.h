#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "tests/support/bytes.h"

namespace pelorin::test_support {

/// What an Exif segment of a camera holds here.
struct CameraExif {
  bool littleEndian = true;
  int orientation = 6;
  std::uint32_t width = 400, height = 300;      ///< Of IFD0 (LONG) and of Exif (SHORT).
  std::vector<std::uint16_t> subjectArea = {};  ///< None when empty.
  Bytes makerNote = {'M', 'A', 'K', 'E', 'R', 1, 2, 3};
  Bytes thumbnail = {};              ///< A JPEG file; no second directory when empty.
  bool noteBehindThumbnail = false;  ///< Else the thumbnail is the segment's end.
};

/// The payload of an APP1 segment.
Bytes cameraExif(const CameraExif& fields);

}  // namespace pelorin::test_support
