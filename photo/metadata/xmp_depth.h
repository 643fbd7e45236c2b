#pragma once

#include <vector>

#include "photo/metadata/loss.h"
#include "photo/metadata/picture_change.h"
#include "photo/metadata/xmp_packet.h"

namespace pelorin::photo {

/// Removes what a packet holds of other views of the picture, and names each kind once: the picture
/// as it was (GImage), depth in pictures behind it (Device), and, unless the picture was neither
/// turned nor scaled, the depth map (GDepth) with its focus (GFocus).
void removeUntrueViews(XmpPacket& packet, const PictureChange& change, std::vector<Loss>& lost);

}  // namespace pelorin::photo
