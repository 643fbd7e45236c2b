#pragma once

#include <cstddef>
#include <string>
#include <vector>

#include "photo/collection/grouping.h"
#include "photo/collection/scanned_photo.h"

namespace pelorin::photo {

/// A photo's place in its group, the best first, and why it stands there.
struct Ranked {
  std::size_t photo;   ///< Place in the list of photos.
  bool keep;           ///< Else another one may stand for it.
  std::string reason;  ///< "the most pixels, 12.0 megapixels".
};

/// Ranks a group by resolution, then by score (photos without one last), then by the size of the
/// file, then by the order of the list. The first is the one to keep, except where photos are
/// references: those come first and stay, and of the others only the first where it has more pixels
/// than any of them. Nothing is done to any file.
std::vector<Ranked> rankGroup(const DupeGroup& group, const std::vector<ScannedPhoto>& photos);

}  // namespace pelorin::photo
