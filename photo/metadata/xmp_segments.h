#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <vector>

#include "photo/jpeg/metadata_segment.h"
#include "photo/metadata/loss.h"
#include "photo/metadata/xmp_packet.h"

namespace pelorin::photo {

/// Whether a segment is a packet.
bool isXmpPacket(const MetadataSegment& segment);
/// Whether a segment is a part of an extension.
bool isXmpExtension(const MetadataSegment& segment);

/// Calls `edit` for each packet of XMP among the segments of a JPEG file: the packet itself and its
/// extension, which is spread over several segments under the MD5 sum of all. What `edit` changes is
/// written back; a packet that outgrows its segment moves its largest properties to the extension,
/// and an extension of which nothing is left goes.
/// Removed, and named in `lost`: packets that cannot be read, extensions that are incomplete, over
/// 64 MiB or of no packet.
void editXmp(std::vector<MetadataSegment>& segments, const std::function<void(XmpPacket&)>& edit,
             std::vector<Loss>& lost);

/// Brings every extension into its packet, which may grow beyond what a JPEG file can hold. Losses
/// are those of `editXmp`.
void mergeXmpExtensions(std::vector<MetadataSegment>& segments, std::vector<Loss>& lost);

}  // namespace pelorin::photo
