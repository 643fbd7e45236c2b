#pragma once

#include <map>
#include <string>

#include "image_processing/filters/filter_description.h"

namespace pelorin::image_processing {

/// A registry of filters by name. Filled during construction, then only read, by any thread.
class FilterFactory {
 public:
  virtual ~FilterFactory() = default;

  /// Lists `description` under its name, in place of an earlier one of that name. The description
  /// is not owned and must outlive the registry.
  void addFilterDescription(FilterDescription* description) {
    descriptions[description->name] = description;
  }

  /// The description of exactly this name, case included, or null.
  const FilterDescription* find(const std::string& name) const {
    const auto found = descriptions.find(name);
    return found == descriptions.end() ? nullptr : found->second;
  }

  std::map<std::string, FilterDescription*> descriptions;  ///< By name, in byte order.
};

}  // namespace pelorin::image_processing
