#pragma once

#include <cstdint>
#include <vector>

#include "cli/frame/talk.h"
#include "photo/collection/scanned_photo.h"

namespace pelorin::cli {

/// A small upright JPEG picture of a photo, at most 256 pixels on its longer side.
/// @throws what reading, decoding and encoding throw, for `explain`; Interrupted on Ctrl-C.
std::vector<std::uint8_t> thumbnailOf(const photo::ScannedPhoto& photo, Talk& talk);

}  // namespace pelorin::cli
