#include "cli/frame/filter_parameters.h"

#include <fmt/format.h>

#include <algorithm>
#include <boost/lexical_cast/bad_lexical_cast.hpp>
#include <cmath>

#include "cli/frame/errors.h"
#include "cli/frame/nearest_name.h"
#include "cli/frame/number_text.h"
#include "image_processing/core/parameter_strings.h"
#include "image_processing/filters/default_filter_factory.h"

namespace pelorin::cli {
namespace {

using image_processing::DefaultFilterFactory;
using image_processing::FilterParams;
using image_processing::splitStringAt;

void requireKnown(const std::string& filter, const std::string& key) {
  const std::vector<std::string> known = parameterNames(filter);
  if (std::find(known.begin(), known.end(), key) != known.end()) return;
  throw UsageError("--params: " + (known.empty() ? filter + " takes no parameters"
                                                 : unknownName("parameter", key, known)));
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

void checkNumber(const std::string& key, const std::string& text, bool inUnit,
                 std::vector<std::string>& warnings) {
  const double number = image_processing::readNumber(text);
  try {
    readFiniteNumber(key, text);
  } catch (const UsageError&) {
    warnings.push_back(fmt::format("{}: '{}' counts as {:g}", key, text, number));
    return;
  }
  if (inUnit && (number < 0.0 || number > 1.0)) {
    warnings.push_back(key + ": " + text + " is not between 0 and 1");
  }
}

void checkCurve(const std::string& key, const std::string& text,
                std::vector<std::string>& warnings) {
  const std::vector<std::string> numbers = splitStringAt(text, ",");
  const std::size_t before = warnings.size();
  for (const std::string& number : numbers) {
    if (warnings.size() == before) checkNumber(key, number, true, warnings);
  }
  const std::string rest = text.substr(text.rfind(',') + 1);
  if (!rest.empty()) warnings.push_back(key + ": '" + rest + "' is ignored without a ',' after it");
  if (numbers.size() < 2) {
    warnings.push_back(key + ": a curve of fewer than 2 numbers is ignored");
  }
}

void checkLook(const std::string& filter, const std::string& params,
               std::vector<std::string>& warnings) {
  for (const std::string& item : splitStringAt(params, ";")) {
    if (item.empty()) continue;
    const std::vector<std::string> keyAndValue = image_processing::splitStringOnceAt(item, "=");
    const std::string &key = keyAndValue[0], &value = keyAndValue[1];
    requireKnown(filter, key);
    if (key == "r" || key == "g" || key == "b") {
      checkCurve(key, value, warnings);
    } else {
      checkNumber(key, value, key != "maskRadius" && key != "applyMask", warnings);
    }
  }
  if (!params.empty() && params.back() != ';') {
    warnings.push_back("what follows the last ';' is ignored: end every parameter with one");
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

std::vector<std::string> parameterNames(const std::string& filter) {
  if (isAutoEnhance(filter)) return {"slider", "gtmOnly", "gtmExtraMemory"};
  if (filter == "PassThrough") return {};
  std::vector<std::string> names = {"maskRadius", "maskAlpha", "applyMask", "r", "g", "b"};
  if (filter == "LowDimRGBCurve") names.insert(names.end(), {"s1", "s2", "s3", "s4"});
  return names;
}

std::vector<std::string> checkParameters(const std::string& filter, const std::string& params) {
  std::vector<std::string> warnings;
  const FilterParams read(params);
  for (const auto& [key, value] : read.items()) requireKnown(filter, key);
  if (isAutoEnhance(filter)) {
    checkAutoEnhance(read, warnings);
  } else {
    checkLook(filter, params, warnings);
  }
  return warnings;
}

}  // namespace pelorin::cli
