#pragma once

#include <algorithm>
#include <string>

#include "image_processing/filters/filtered_image.h"

namespace pelorin::quenby {

/// Applies a filter by name with the default configuration; an unknown name copies the source.
inline void filterOrCopy(image_processing::FilteredImage& filteredImage,
                         const image_processing::Image<image_processing::RGBA8Pixel>& source,
                         const std::string& name, const std::string& params,
                         image_processing::Image<image_processing::RGBA8Pixel>& output) {
  if (!filteredImage.applyFilterWithParams(name, params, image_processing::defaultFilterConfigValue,
                                           output))
    std::copy_n(source.data.get(), source.pixelCount(), output.data.get());
}

}  // namespace pelorin::quenby
