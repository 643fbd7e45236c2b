#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "photo/turn.h"

namespace pelorin::photo {

/// Turns a JPEG file of which nothing can be moved without loss: decodes it, and encodes it again in
/// the same colours, at quality 100 and with every channel whole. Segments are kept.
std::vector<std::uint8_t> turnPixels(std::span<const std::uint8_t> file, const Turn& turn);

}  // namespace pelorin::photo
