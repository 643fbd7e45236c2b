#pragma once

#include <string>

namespace pelorin::cli {

/// docs/filters.md: every filter with its keys, from what filters tell of themselves.
std::string filtersPage();

}  // namespace pelorin::cli
