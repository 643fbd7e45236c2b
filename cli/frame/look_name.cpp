#include "cli/frame/look_name.h"

#include <algorithm>
#include <cctype>

#include "cli/frame/errors.h"
#include "cli/frame/nearest_name.h"
#include "image_processing/filters/default_filter_factory.h"

namespace pelorin::cli {

using image_processing::FilterDescription;

bool equalInAnyCase(const std::string& one, const std::string& other) {
  return std::equal(one.begin(), one.end(), other.begin(), other.end(), [](char a, char b) {
    return std::tolower(static_cast<unsigned char>(a)) ==
           std::tolower(static_cast<unsigned char>(b));
  });
}

const FilterDescription& lookNamed(const std::string& name) {
  const auto registry = image_processing::DefaultFilterFactory::filterFactory();
  std::vector<std::string> names;
  const FilterDescription* shownSo = nullptr;
  for (const auto& [key, description] : registry->descriptions) {
    if (equalInAnyCase(name, key)) return *description;
    if (shownSo == nullptr && equalInAnyCase(name, description->displayName)) shownSo = description;
    names.push_back(key);
    names.push_back(description->displayName);
  }
  if (shownSo != nullptr) return *shownSo;
  throw UsageError(unknownName("look", name, names));
}

const FilterDescription& filterNamed(const std::string& name) {
  std::vector<std::string> names;
  for (const FilterDescription* filter : allFilters()) {
    if (filter->name == name) return *filter;
    names.push_back(filter->name);
  }
  throw UsageError("--filter: " + unknownName("filter", name, names));
}

std::vector<const FilterDescription*> allFilters() {
  std::vector<const FilterDescription*> filters;
  const auto registry = image_processing::DefaultFilterFactory::filterFactory();
  for (const auto& [name, filter] : registry->descriptions) filters.push_back(filter);
  return filters;
}

std::vector<std::string> othersShownAs(const FilterDescription& look) {
  const auto registry = image_processing::DefaultFilterFactory::filterFactory();
  std::vector<std::string> others;
  for (const auto& [key, description] : registry->descriptions) {
    if (key != look.name && description->displayName == look.displayName) others.push_back(key);
  }
  return others;
}

}  // namespace pelorin::cli
