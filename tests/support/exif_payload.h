#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "tests/support/bytes.h"

namespace pelorin::test_support {

/// What an Exif segment may say here.
struct ExifFields {
  int orientation = 0;                       ///< 0: no such tag.
  std::string dateTime, subSeconds, offset;  ///< Of the original.
};

/// An APP1 payload, "Exif" and a TIFF file in either byte order.
Bytes exifPayload(const ExifFields& fields, bool littleEndian);

}  // namespace pelorin::test_support
