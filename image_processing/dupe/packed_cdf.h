#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "image_processing/dupe/green_cdf.h"

namespace pelorin::image_processing {

/// A distribution in a third of its room, so that those of a million photos can be held: the counts it was
/// made of, each in as few bits as its neighbours need. Nothing is lost: what is not made of counts, or of
/// which it is not known how many pixels were counted, is kept as it is.
class PackedCDF {
 public:
  PackedCDF() = default;  ///< All 0, as of an empty image.

  /// @param pixelCount  over how many pixels `cdf` was counted; with a wrong number it takes more room.
  /// @throws std::bad_alloc.
  PackedCDF(const GreenCDF& cdf, std::uint64_t pixelCount = 0);

  /// The distribution, bit for bit.
  GreenCDF unpacked() const;

  /// What it takes beside the object.
  std::size_t byteCount() const { return bytes_.size(); }

 private:
  std::vector<std::uint8_t> bytes_;
};

}  // namespace pelorin::image_processing
