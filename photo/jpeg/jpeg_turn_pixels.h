#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "photo/turn.h"

namespace pelorin::photo {

/// Turns a JPEG file of which nothing can be moved without loss, or that becomes smaller: decodes it,
/// and encodes it again in the same colours, at quality 100 and with every channel whole. Segments
/// are kept.
/// @param divisor  1, 2, 4 or 8: of both sides, rounded up.
std::vector<std::uint8_t> turnPixels(std::span<const std::uint8_t> file, const Turn& turn,
                                     unsigned divisor = 1);

}  // namespace pelorin::photo
