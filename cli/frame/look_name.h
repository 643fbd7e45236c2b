#pragma once

#include <string>
#include <vector>

#include "image_processing/filters/filter_description.h"

namespace pelorin::cli {

/// The filter a user means: a registry name or a display name, in any letters; of several filters
/// that show one name the first.
/// @throws UsageError that names the nearest one.
const image_processing::FilterDescription& lookNamed(const std::string& name);

/// The filter of exactly this registry name.
/// @throws UsageError that names the nearest one.
const image_processing::FilterDescription& filterNamed(const std::string& name);

/// Every filter of the registry, in its order.
std::vector<const image_processing::FilterDescription*> allFilters();

/// The registry names of the other filters with the display name of this one.
std::vector<std::string> othersShownAs(const image_processing::FilterDescription& look);

/// Whether two names differ at most in upper and lower case.
bool equalInAnyCase(const std::string& one, const std::string& other);

}  // namespace pelorin::cli
