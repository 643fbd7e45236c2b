#pragma once

#include <memory>

#include "image_processing/filters/filtered_image_state.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {

/// The state of a session on `picture`, whose pixels are shared.
inline std::shared_ptr<image_processing::FilteredImageState> stateOf(
    const Image<RGBA8Pixel>& picture, const image_processing::ImageMetadata& metadata = {},
    const image_processing::FilterConfig& config = image_processing::defaultFilterConfigValue) {
  return std::make_shared<image_processing::FilteredImageState>(
      image_processing::FilteredImageState{.image = std::make_shared<Image<RGBA8Pixel>>(picture),
                                           .metadata = metadata,
                                           .sessionName = "",
                                           .config = config});
}

}  // namespace pelorin::test_support
