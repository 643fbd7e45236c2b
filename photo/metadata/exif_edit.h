#pragma once

#include <cstdint>
#include <vector>

#include "photo/metadata/loss.h"
#include "photo/metadata/picture_change.h"
#include "photo/metadata/thumbnail.h"

namespace pelorin::photo {

/// Makes an Exif segment state what the picture is, where it states anything of the kind:
/// orientation 1, its size (ImageWidth and ImageLength, PixelXDimension and PixelYDimension), where
/// the subject stands (SubjectArea, SubjectLocation). Values are patched in place; nothing else
/// moves and nothing that is not known is touched, maker notes least of all.
///
/// The thumbnail is made anew at its old size class and stands where the old one did. One that
/// cannot be (no JPEG, no room even at low quality) goes and is named; the old pixels are gone in
/// any case.
/// @param payload     an APP1 segment after its length. Any bytes are safe.
/// @param thumbnails  of the picture; null for a segment without one.
void editExif(std::vector<std::uint8_t>& payload, const PictureChange& change,
              ThumbnailMaker* thumbnails, std::vector<Loss>& lost);

/// Removes the GPS directory of an Exif segment and clears what it told; nothing else moves. Any
/// bytes are safe.
void removeExifLocation(std::vector<std::uint8_t>& payload);

}  // namespace pelorin::photo
