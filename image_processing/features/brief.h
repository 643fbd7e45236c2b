#pragma once

#include <array>
#include <cstdint>
#include <iosfwd>
#include <vector>

#include "image_processing/core/export.h"
#include "image_processing/core/image.h"
#include "image_processing/features/xy.h"

namespace pelorin::image_processing {

/// A corner and what the 31 x 31 pixels around it look like: 256 comparisons of pixel pairs
/// (Calonder, Lepetit, Strecha and Fua, "BRIEF: Binary Robust Independent Elementary Features",
/// 2010). The number of bits in which two descriptors differ tells how unlike two corners are.
struct BriefDescriptor {
  xy center;
  /// Bit i is bit i mod 32 of word i / 32.
  std::array<std::uint32_t, 8> descriptor;

  friend bool operator==(const BriefDescriptor&, const BriefDescriptor&) = default;
};

/// Descriptors of the corners that `fast9_detect_nonmax` finds in a grey image, in its order; those
/// too close to a border are left out.
/// @param threshold  how much brighter or darker a corner's surroundings are; any number.
/// @throws std::bad_alloc
///
/// Keeps no state; any thread may call it. An image with a side above 2^31 - 1 has no corners.
PELORIN_EXPORT std::vector<BriefDescriptor> computeBriefDescriptors(
    const Image<unsigned char>& image, int threshold);

/// Appends the descriptors of `count` corners to `descriptors`, in order. Skips every corner with
/// 15 pixels or less before it, or less than 16 from it on, in either direction: it is kept where
/// 15 < x < width - 15 and 15 < y < height - 15.
/// @param corners  any positions; none are read when `count` is 0 or less.
/// @throws std::bad_alloc
PELORIN_EXPORT void brief(const xy* corners, int count, const Image<unsigned char>& image,
                          std::vector<BriefDescriptor>& descriptors);

/// Writes "(x, y)".
PELORIN_EXPORT std::ostream& operator<<(std::ostream& stream, const xy& position);

/// Writes the position and both ends of the bits, most significant first:
/// "{ center = (20, 31), descriptor = 01101...00110 }".
PELORIN_EXPORT std::ostream& operator<<(std::ostream& stream, const BriefDescriptor& descriptor);

/// Writes the descriptors with ", " between them, nothing when there are none.
PELORIN_EXPORT std::ostream& operator<<(std::ostream& stream,
                                        const std::vector<BriefDescriptor>& descriptors);

}  // namespace pelorin::image_processing

/// `xy` lies in no namespace, and its operators are looked up where it lies.
using pelorin::image_processing::operator<<;
