#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <stop_token>
#include <vector>

#include "photo/collection/grouping.h"
#include "photo/collection/scanned_photo.h"
#include "photo/decode_limits.h"
#include "photo/photo_rows.h"

namespace pelorin::photo {

/// The photos whose score decides their rank, in the order of the groups: those with as many pixels
/// as another of their group.
std::vector<std::size_t> photosToScore(const std::vector<DupeGroup>& groups,
                                       const std::vector<ScannedPhoto>& photos);

/// The NIQE score of the full-size upright picture of a file; NaN when it is too small.
/// @throws PhotoError as `open`, Stopped when `stop` says so.
float scoreOf(std::span<const std::uint8_t> file, std::stop_token stop = {},
              const RowResources& resources = {}, const DecodeLimits& limits = {});

}  // namespace pelorin::photo
