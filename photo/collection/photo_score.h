#pragma once

#include <cstddef>
#include <vector>

#include "photo/collection/grouping.h"
#include "photo/collection/scanned_photo.h"

namespace pelorin::cli {

/// The photos whose score decides their rank, in the order of the groups: those with as many pixels
/// as another of their group.
std::vector<std::size_t> photosToScore(const std::vector<DupeGroup>& groups,
                                       const std::vector<ScannedPhoto>& photos);

/// The NIQE score of the full-size upright picture; NaN when it is too small.
/// @throws what reading and decoding throw, for `explain`; Interrupted on Ctrl-C.
float scoreOf(const Input& input);

}  // namespace pelorin::cli
