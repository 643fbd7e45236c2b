#pragma once

#include <cmath>
#include <optional>

#include "image_processing/dupe/packed_cdf.h"

namespace pelorin::photo {

/// When a photo was taken, in seconds; both clocks count from the same midnight.
struct ShotTime {
  double wallClock;           ///< What a clock where the photo was taken showed.
  std::optional<double> utc;  ///< Where the offset of that clock is known.
};

/// All that the duplicate score needs of a photo.
struct Shot {
  image_processing::PackedCDF cdf;
  int orientation = 1;  ///< Only compared for equality.
  std::optional<ShotTime> time;
};

/// Seconds between two times. Without both offsets the wall clocks are compared: a copy of a photo
/// that lost its offset was still taken at the same moment.
inline double secondsBetween(const ShotTime& a, const ShotTime& b) {
  return std::fabs(a.utc && b.utc ? *a.utc - *b.utc : a.wallClock - b.wallClock);
}

}  // namespace pelorin::photo
