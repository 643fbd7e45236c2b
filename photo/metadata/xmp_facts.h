#pragma once

#include <vector>

#include "photo/metadata/loss.h"
#include "photo/metadata/picture_change.h"
#include "photo/metadata/xmp_packet.h"

namespace pelorin::photo {

/// Makes a packet state what the picture is, where it states anything of the kind: orientation 1
/// (tiff:Orientation), its size (tiff:ImageWidth and ImageLength, exif:PixelXDimension and
/// PixelYDimension). Removes thumbnails of the picture that was (xmp:Thumbnails) and names them.
void stateFacts(XmpPacket& packet, const PictureChange& change, std::vector<Loss>& lost);

}  // namespace pelorin::photo
