#pragma once

#include <string>
#include <vector>

#include "photo/metadata/metadata.h"

namespace pelorin::photo {

/// A face that a file knows of, in fractions of the upright picture, 0,0 its top left corner.
struct KnownFace {
  double left, top, right, bottom;
  std::string name;  ///< Of the person; empty where none is stated.
};

/// The faces among the regions that a photo's XMP holds, where they stand in the decoded picture.
/// Packets that cannot be read have none.
/// @param decoded  the picture's size.
std::vector<KnownFace> knownFaces(const Metadata& metadata, PictureSize decoded);

}  // namespace pelorin::photo
