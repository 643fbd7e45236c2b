#pragma once

#include <string>
#include <vector>

namespace pelorin::cli {

/// @throws UsageError naming the nearest filter when no filter has exactly this registry name.
void requireFilter(const std::string& name);

/// Whether the filter is one of the automatic enhancements, which need a slider.
bool isAutoEnhance(const std::string& filter);

/// The keys that a filter reads from its parameter string.
std::vector<std::string> parameterNames(const std::string& filter);

/// Reads a parameter string as the filter will.
/// @returns what the filter will ignore or take otherwise than it looks, one clause each.
/// @throws UsageError for keys that the filter does not know, and for an automatic enhancement
///         without a slider that is a number.
std::vector<std::string> checkParameters(const std::string& filter, const std::string& params);

}  // namespace pelorin::cli
