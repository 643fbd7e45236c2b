#pragma once

#include <memory>

#include "image_processing/core/image.h"
#include "photo/turn.h"

namespace pelorin::photo {

/// The turned picture in pixels of its own; `picture` itself when there is nothing to turn.
/// @throws std::bad_alloc when the second picture does not fit.
std::shared_ptr<image_processing::Image<image_processing::RGBA8Pixel>> turned(
    const std::shared_ptr<image_processing::Image<image_processing::RGBA8Pixel>>& picture,
    Turn turn);

}  // namespace pelorin::photo
