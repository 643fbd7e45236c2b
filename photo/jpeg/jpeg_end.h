#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

#include "photo/file_view.h"

namespace pelorin::photo {

/// Where a JPEG file ends among bytes that begin with one: behind its end mark, whatever follows. The
/// number of bytes when there is no end mark, and 0 when there is no start mark.
std::size_t jpegEnd(std::span<const std::uint8_t> bytes);

/// The same of a file that may be partly elsewhere. @throws what reading throws.
std::uint64_t jpegEndIn(const FileView& file);

/// Whether bytes begin with the whole header of a JPEG file that is not progressive, up to a first scan
/// that has every channel, so that nothing behind it needs to be known beforehand. Any bytes are safe.
bool beginsPlainJpeg(std::span<const std::uint8_t> bytes);

/// Whether a JPEG file has more segments than these before its picture data. Any bytes are safe.
bool hasMoreSegments(std::span<const std::uint8_t> bytes, std::size_t most);

}  // namespace pelorin::photo
