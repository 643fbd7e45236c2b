#include "cli/common/filter_parameters.h"

#include <algorithm>
#include <boost/lexical_cast/bad_lexical_cast.hpp>
#include <cmath>

#include "cli/common/errors.h"
#include "cli/common/nearest_name.h"
#include "image_processing/core/parameter_strings.h"
#include "image_processing/filters/default_filter_factory.h"

namespace pelorin::cli {
namespace {

using image_processing::DefaultFilterFactory;
using image_processing::FilterParams;

std::vector<std::string> parameterNames(const std::string& filter) {
  if (isAutoEnhance(filter)) return {"slider", "gtmOnly", "gtmExtraMemory"};
  if (filter == "PassThrough") return {};
  std::vector<std::string> names = {"maskRadius", "maskAlpha", "applyMask", "r", "g", "b"};
  if (filter == "LowDimRGBCurve") names.insert(names.end(), {"s1", "s2", "s3", "s4"});
  return names;
}

void checkAutoEnhance(const FilterParams& params, std::vector<std::string>& warnings) {
  if (!params.items().contains("slider")) {
    throw UsageError("--params: the filter needs a slider, for example \"slider=0.4;\"");
  }
  const std::string& text = params.at("slider");
  try {
    if (!std::isfinite(params.readFloat("slider"))) {
      warnings.push_back("slider=" + text + " is not a finite number");
    }
  } catch (const boost::bad_lexical_cast&) {
    throw UsageError("--params: slider: '" + text + "' is not a number");
  }
  for (const char* name : {"gtmOnly", "gtmExtraMemory"}) {
    const auto found = params.items().find(name);
    if (found != params.items().end() && found->second != "true" && found->second != "false") {
      warnings.push_back(std::string(name) + "=" + found->second + " counts as " +
                         image_processing::textOf(params.readBool(name)) + "; write true or false");
    }
  }
}

}  // namespace

void requireFilter(const std::string& name) {
  const auto registry = DefaultFilterFactory::filterFactory();
  if (registry->find(name) != nullptr) return;
  std::vector<std::string> names;
  for (const auto& [known, description] : registry->descriptions) names.push_back(known);
  throw UsageError("--filter: " + unknownName("filter", name, names));
}

bool isAutoEnhance(const std::string& filter) {
  return filter == "AE0" || filter == "AE08bit";
}

std::vector<std::string> checkParameters(const std::string& filter, const std::string& params) {
  std::vector<std::string> warnings;
  const std::vector<std::string> known = parameterNames(filter);
  const FilterParams read(params);
  for (const auto& [key, value] : read.items()) {
    if (std::find(known.begin(), known.end(), key) != known.end()) continue;
    throw UsageError("--params: " + (known.empty() ? filter + " takes no parameters"
                                                   : unknownName("parameter", key, known)));
  }
  if (isAutoEnhance(filter)) {
    checkAutoEnhance(read, warnings);
  } else if (!params.empty() && params.back() != ';') {
    warnings.push_back("what follows the last ';' is ignored: end every parameter with one");
  }
  return warnings;
}

}  // namespace pelorin::cli
