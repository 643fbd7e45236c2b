#pragma once

#include <string>

#include "image_processing/filters/filter_description.h"

namespace pelorin::cli {

/// The filter a user means: a registry name or a display name, in any letters; of several filters
/// that show one name the first.
/// @throws UsageError that names the nearest one.
const image_processing::FilterDescription& lookNamed(const std::string& name);

}  // namespace pelorin::cli
