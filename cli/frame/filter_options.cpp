#include "cli/frame/filter_options.h"

#include <fmt/format.h>
#include <fmt/ranges.h>

#include <algorithm>
#include <cctype>
#include <utility>

#include "cli/frame/errors.h"
#include "image_processing/filters/parameter_check.h"

namespace pelorin::cli {
namespace {

using image_processing::FilterDescription;
using image_processing::FilterParameter;
using image_processing::FilterParameters;
using image_processing::ParameterFault;
using image_processing::ParameterKind;
using image_processing::ParameterReader;

constexpr const char* heading = "Filter";

// Where the key itself would read badly.
constexpr std::pair<const char*, const char*> shorterNames[] = {{"applyMask", "--mask"},
                                                                {"gtmOnly", "--global-only"}};

/// One key and every filter that has it.
struct SharedKey {
  FilterParameter row;  ///< As the first of them has it.
  ParameterReader reader;
  std::vector<std::string> filters = {};
  bool standardsDiffer = false, oneIsTrue = false;
};

std::vector<SharedKey> keysOf(const FilterDescriptions& filters) {
  std::vector<SharedKey> keys;
  for (const FilterDescription* filter : filters) {
    const FilterParameters parameters = filter->parameters();
    for (const FilterParameter& row : parameters.rows) {
      auto key = std::ranges::find(keys, row.name, [](const SharedKey& k) { return k.row.name; });
      if (key == keys.end()) key = keys.insert(key, {row, parameters.reader});
      key->filters.push_back(filter->name);
      key->standardsDiffer = key->standardsDiffer || key->row.standard != row.standard;
      key->oneIsTrue = key->oneIsTrue || row.standard.value_or(0.0f) != 0.0f;
    }
  }
  return keys;
}

std::string helpOf(const SharedKey& key, std::size_t filters) {
  const FilterParameter& row = key.row;
  std::string help = row.description;
  if (row.kind != ParameterKind::boolean) {
    help += ": " + wantedValue(row, key.reader);
    if (row.standard) {
      help +=
          "; " +
          (key.standardsDiffer ? "the filter's own" : valueText(row, key.reader, *row.standard)) +
          " unless given";
    }
  }
  if (!row.onlyWith.empty()) help += "; with " + optionFor(row.onlyWith);
  const bool few = key.filters.size() < filters && key.filters.size() <= 2;
  return few ? fmt::format("{} ({})", help, fmt::join(key.filters, ", ")) : help;
}

bool isHarmless(const ParameterFault& fault) {
  return fault.kind == ParameterFault::Kind::misread || fault.kind == ParameterFault::Kind::ignored;
}

}  // namespace

std::string optionFor(const std::string& key) {
  for (const auto& [known, option] : shorterNames) {
    if (key == known) return option;
  }
  std::string option = "--";
  for (const char letter : key) {
    const auto byte = static_cast<unsigned char>(letter);
    if (std::isupper(byte)) option += '-';
    option += static_cast<char>(std::tolower(byte));
  }
  return option;
}

FilterOptions::FilterOptions(Verb verb, const FilterDescriptions& filters,
                             const std::string& example) {
  const std::vector<SharedKey> shared = keysOf(filters);
  for (const SharedKey& key : shared) {
    const std::string name = optionFor(key.row.name);
    const std::string help = helpOf(key, filters.size());
    Option on, off;
    if (key.row.kind == ParameterKind::boolean) {
      on = verb.flag(name, help);
      if (key.oneIsTrue) {
        off = verb.flag("--no-" + name.substr(2), "Not " + name);
        off.group(heading).excludes(on);
      }
    } else {
      on = verb.option(name, help);
      on.type(key.row.kind == ParameterKind::numbers ? "N,N,..." : "NUMBER");
    }
    keys_.push_back({key.row.name, on.group(heading), off});
  }
  for (const SharedKey& key : shared) {
    const Key* needed = find(key.row.onlyWith);
    if (needed != nullptr && needed->off.exists()) {
      Option(needed->off).excludes(find(key.row.name)->on);
    }
  }
  params_ =
      verb.option("--params", "The filter's own parameters in place of all these, for example \"" +
                                  example + "\"")
          .type("TEXT")
          .group(heading);
}

std::optional<std::string> FilterOptions::Key::given() const {
  if (on.given()) return on.name();
  if (off.given()) return off.name();
  return std::nullopt;
}

const FilterOptions::Key* FilterOptions::find(const std::string& key) const {
  const auto found = std::ranges::find(keys_, key, &Key::key);
  return found == keys_.end() ? nullptr : &*found;
}

std::string FilterOptions::readVerbatim(const FilterDescription& filter, Talk& talk) const {
  for (const Key& key : keys_) {
    if (!key.given()) continue;
    throw UsageError("--params: takes the place of " + *key.given() + "; give only one of them");
  }
  const std::string params = params_.text();
  const std::vector<ParameterFault> faults = checkParameters(filter, params);
  for (const ParameterFault& fault : faults) {
    if (!isHarmless(fault)) throw UsageError("--params: " + fault.message);
  }
  for (const ParameterFault& fault : faults) talk.note("note: --params: " + fault.message);
  return params;
}

std::string FilterOptions::read(const FilterDescription& filter, Talk& talk) const {
  if (verbatim()) return readVerbatim(filter, talk);
  const FilterParameters parameters = filter.parameters();
  for (const Key& key : keys_) {
    if (key.given() && parameters.find(key.key) == nullptr) {
      throw UsageError(*key.given() + ": has no effect on " + filter.name);
    }
  }
  const auto isTrue = [&](const FilterParameter& row) {
    const Key* key = find(row.name);
    if (key == nullptr || !key->given()) return row.standard.value_or(0.0f) != 0.0f;
    return key->on.given();
  };
  std::string params;
  for (const FilterParameter& row : parameters.rows) {
    const Key* key = find(row.name);
    if (key == nullptr || !key->given()) {
      if (row.required && row.standard) {
        params += row.name + "=" + valueText(row, parameters.reader, *row.standard) + ";";
      }
      continue;
    }
    const std::string option = *key->given();
    const FilterParameter* needed = parameters.find(row.onlyWith);
    if (needed != nullptr && !isTrue(*needed)) {
      throw UsageError(option + ": has no effect on " + filter.name + " without " +
                       optionFor(needed->name));
    }
    std::string text = row.kind == ParameterKind::boolean
                           ? valueText(row, parameters.reader, key->on.given() ? 1.0f : 0.0f)
                           : key->on.text();
    if (row.kind == ParameterKind::numbers && !text.ends_with(',')) text += ',';
    params += parameterItem(filter, row.name, option, text);
  }
  for (const ParameterFault& fault : checkParameters(filter, params)) {
    talk.note("note: " + fault.message);
  }
  return params;
}

std::string parameterItem(const FilterDescription& filter, const std::string& key,
                          const std::string& option, const std::string& text) {
  if (text.find(';') != std::string::npos) throw UsageError(option + ": a value holds no ';'");
  const std::string item = key + "=" + text + ";";
  for (const ParameterFault& fault : checkParameters(filter, item)) {
    const bool itsOwn = fault.key == key && fault.kind != ParameterFault::Kind::ignored;
    if (itsOwn) throw UsageError(option + ": " + fault.message);
  }
  return item;
}

}  // namespace pelorin::cli
