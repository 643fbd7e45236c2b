#pragma once

#include <array>
#include <cstdint>

namespace pelorin::image_processing {

/// One comparison: the bit is 1 where the first pixel is darker than the second. Steps from the
/// corner, rows before columns.
struct BriefPair {
  std::int8_t dy1, dx1, dy2, dx2;
};

/// How far the pattern reaches from the corner.
constexpr int briefReach = 15;

/// The 256 comparisons of a descriptor; row i defines bit i. Drawn once from a Gaussian of
/// deviation 7.2, rounded and held within the reach, by tools/draw_brief_pattern.py (rows 0 to 3
/// and 255 were given). Frozen: other rows would make descriptors that do not compare with stored
/// ones. Checked by the BriefPattern tests.
extern const std::array<BriefPair, 256> briefPattern;

}  // namespace pelorin::image_processing
