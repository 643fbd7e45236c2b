#pragma once

#include <vector>

#include "photo/metadata/loss.h"
#include "photo/metadata/picture_change.h"
#include "photo/metadata/xmp_packet.h"

namespace pelorin::photo {

/// Removes what a packet holds of other views of the picture, and names each kind once: the picture
/// as it was (GImage), depth behind it (Device, Apple's depthBlurEffect and its like, Xiaomi's XMPMeta,
/// which tells places in what went from there), and, unless the picture was neither turned nor scaled,
/// the depth map (GDepth) with its focus (GFocus).
void removeUntrueViews(XmpPacket& packet, const PictureChange& change, std::vector<Loss>& lost);

}  // namespace pelorin::photo
