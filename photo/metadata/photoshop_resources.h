#pragma once

#include <vector>

#include "photo/metadata/loss.h"
#include "photo/metadata/metadata_segment.h"

namespace pelorin::photo {

/// Removes the thumbnails among Photoshop's resources (APP13), which show the picture as it was, and
/// names them. Nothing else changes; resources that are cut off stay as they are.
void removePhotoshopThumbnails(std::vector<MetadataSegment>& segments, std::vector<Loss>& lost);

}  // namespace pelorin::photo
