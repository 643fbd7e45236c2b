#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>

namespace pelorin::photo {

/// When a photo was taken, as its camera wrote it.
struct CaptureTime {
  std::string text;  ///< "2024-05-01T12:30:45.25+02:00", without the parts that are not known.
  double seconds;    ///< Since 1970-01-01T00:00:00 in the camera's zone; in UTC if hasZone.
  bool hasZone;      ///< Whether the offset from UTC was stated.
  int zoneSeconds;   ///< That offset, east positive; 0 where it was not.
};

/// The capture time in an Exif segment (an APP1 payload, any bytes are safe): the original's, with
/// sub-seconds and offset where present, else the digitised, else the file's. Empty when there is
/// none that is a date.
std::optional<CaptureTime> exifCaptureTime(std::span<const std::uint8_t> payload);

}  // namespace pelorin::photo
