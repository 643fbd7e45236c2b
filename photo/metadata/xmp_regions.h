#pragma once

#include <vector>

#include "photo/metadata/known_faces.h"
#include "photo/metadata/picture_change.h"
#include "photo/metadata/xmp_packet.h"

namespace pelorin::photo {

/// Brings the regions of a packet to where their contents stand in the changed picture, and states
/// its size beside them: the Metadata Working Group's (mwg-rs), ACDSee's (acdsee-rs), Microsoft's
/// (MP) and IPTC's (Iptc4xmpExt:ImageRegion). Regions refer to the picture as stored, except that
/// those whose AppliedToDimensions is the upright size refer to that, with which some programs
/// write them; unless their contents are said to lie there as they do in the stored picture, as
/// Lightroom writes it. A list whose AppliedToDimensions has the shape of neither belongs to
/// another crop and stays as it is. How far a face is turned (Lightroom's mwg-rs:Rotation, Apple's
/// AngleInfoRoll and AngleInfoYaw) is turned likewise; both count clockwise.
void turnRegions(XmpPacket& packet, const PictureChange& change);

/// The faces among the regions of a packet, each person once though two dialects tell of it, by
/// where they stand in the picture made by `change`. Regions that are no rectangle or circle, or
/// that belong to another crop, are left out.
std::vector<KnownFace> facesOf(const XmpPacket& packet, const PictureChange& change);

}  // namespace pelorin::photo
