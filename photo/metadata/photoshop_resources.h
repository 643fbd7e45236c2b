#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "photo/jpeg/metadata_segment.h"
#include "photo/metadata/loss.h"

namespace pelorin::photo {

/// Whether a segment holds Photoshop's resources (APP13), of which IPTC is one.
bool isPhotoshopResources(const MetadataSegment& segment);

/// Removes the thumbnails among Photoshop's resources (APP13), which show the picture as it was, and
/// names them. Nothing else changes; resources that are cut off stay as they are.
void removePhotoshopThumbnails(std::vector<MetadataSegment>& segments, std::vector<Loss>& lost);

/// Resources that have these data sets of record 2 of another segment's IPTC, with the character set
/// they are in, and nothing else; without payload when there is none of them. Any bytes are safe.
MetadataSegment iptcExcerpt(const MetadataSegment& segment, std::span<const std::uint8_t> dataSets);

}  // namespace pelorin::photo
