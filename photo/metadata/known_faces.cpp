#include "photo/metadata/known_faces.h"

#include <iterator>

#include "photo/metadata/xmp_regions.h"
#include "photo/metadata/xmp_segments.h"

namespace pelorin::photo {

std::vector<KnownFace> knownFaces(const Metadata& metadata, PictureSize decoded) {
  const PictureChange change = {metadata.storedSize, decoded, metadata.turn, metadata.orientation};
  std::vector<KnownFace> faces;
  std::vector<MetadataSegment> unchanged = metadata.segments;
  std::vector<Loss> unreadable;
  editXmp(
      unchanged,
      [&](const XmpPacket& packet) {
        std::vector<KnownFace> more = facesOf(packet, change);
        faces.insert(faces.end(), std::make_move_iterator(more.begin()),
                     std::make_move_iterator(more.end()));
      },
      unreadable);
  return faces;
}

}  // namespace pelorin::photo
