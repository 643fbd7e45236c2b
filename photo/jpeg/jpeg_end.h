#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

namespace pelorin::photo {

/// Where a JPEG file ends among bytes that begin with one: behind its end mark, whatever follows. The
/// number of bytes when there is no end mark, and 0 when there is no start mark.
std::size_t jpegEnd(std::span<const std::uint8_t> bytes);

/// Whether a JPEG file has more segments than these before its picture data. Any bytes are safe.
bool hasMoreSegments(std::span<const std::uint8_t> bytes, std::size_t most);

}  // namespace pelorin::photo
