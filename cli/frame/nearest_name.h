#pragma once

#include <string>
#include <vector>

namespace pelorin::cli {

/// The candidate that takes the fewest changed letters to reach from `name` (upper and lower case
/// count as half a change), the first of several; empty without candidates.
std::string nearestName(const std::string& name, const std::vector<std::string>& candidates);

/// "unknown filter 'AE1'; did you mean 'AE0'?"
std::string unknownName(const std::string& kind, const std::string& name,
                        const std::vector<std::string>& candidates);

}  // namespace pelorin::cli
