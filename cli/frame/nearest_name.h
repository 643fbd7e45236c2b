#pragma once

#include <string>
#include <vector>

namespace pelorin::cli {

/// The candidate that takes the fewest changed letters to reach from `name` (upper and lower case
/// count as half a change), the first of several; empty where that would be half of the letters of
/// the longer one or more.
std::string nearestName(const std::string& name, const std::vector<std::string>& candidates);

/// "unknown filter 'AE1'; did you mean 'AE0'?"
std::string unknownName(const std::string& kind, const std::string& name,
                        const std::vector<std::string>& candidates);

}  // namespace pelorin::cli
