#pragma once

#include <memory>
#include <string>

#include "image_processing/core/image.h"
#include "image_processing/core/image_metadata.h"
#include "image_processing/core/workers.h"
#include "image_processing/filters/filter_config.h"

namespace pelorin::image_processing {

/// What all filters of one editing session share. Read-only once the session exists.
struct FilteredImageState {
  std::shared_ptr<Image<RGBA8Pixel>> image;  ///< The source; its pixels are the caller's.
  ImageMetadata metadata;
  std::string sessionName;  ///< For the caller's own use; nothing depends on it.
  FilterConfig config;
  Workers* workers = nullptr;  ///< Share the work of its filters; null for none.
};

}  // namespace pelorin::image_processing
