#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "photo/metadata/kept_metadata.h"

namespace pelorin::photo {

/// What a PNG file says beside its picture: EXIF, colour profile and XMP as segments, what else
/// belongs to a photo as chunks.
/// @throws PhotoError when one of them is damaged or the file ends before its end mark.
Metadata pngMetadata(std::span<const std::uint8_t> file);

/// Metadata as the chunks of a PNG file.
std::vector<PngChunk> chunksOf(const KeptMetadata& metadata);

}  // namespace pelorin::photo
