#include <fmt/format.h>

#include <algorithm>
#include <cmath>
#include <memory>

#include "cli/frame/filter_options.h"
#include "cli/frame/json_output.h"
#include "cli/frame/look_name.h"
#include "cli/verbs/filters_page.h"
#include "cli/verbs/verbs.h"
#include "image_processing/filters/parameter_check.h"

namespace pelorin::cli {
namespace {

using image_processing::FilterDescription;
using image_processing::FilterParameter;
using image_processing::FilterParameters;
using image_processing::ParameterKind;
using image_processing::ParameterReader;

struct LooksOptions {
  ReportOptions report;
  bool markdown = false;
};

Json shortNumber(float value) {
  return Json::parse(fmt::format("{}", value));
}

Json jsonOf(const FilterParameter& row, ParameterReader reader) {
  const char* kinds[] = {"number", "boolean", "numbers"};
  Json object = {{"name", row.name}, {"kind", kinds[static_cast<int>(row.kind)]}};
  if (std::isfinite(row.lowest)) {
    object[row.aboveLowest ? "exclusiveMinimum" : "minimum"] = shortNumber(row.lowest);
  }
  if (std::isfinite(row.highest)) object["maximum"] = shortNumber(row.highest);
  if (row.kind == ParameterKind::numbers) object["minItems"] = row.fewest;
  if (row.kind == ParameterKind::boolean) {
    object["false"] = valueText(row, reader, 0.0f);
    object["true"] = valueText(row, reader, 1.0f);
  }
  object["default"] = nullptr;
  if (row.standard) {
    object["default"] = row.kind == ParameterKind::boolean ? Json(*row.standard != 0.0f)
                                                           : shortNumber(*row.standard);
  }
  object["required"] = row.required;
  if (!row.onlyWith.empty()) object["onlyWith"] = row.onlyWith;
  object["option"] = optionFor(row.name);
  object["description"] = row.description;
  return object;
}

Json jsonOf(const FilterDescription& look) {
  const FilterParameters parameters = look.parameters();
  Json rows = Json::array();
  for (const FilterParameter& row : parameters.rows) rows.push_back(jsonOf(row, parameters.reader));
  return {{"name", look.name},
          {"displayName", look.displayName},
          {"description", look.description},
          {"usesFaces", parameters.readsFaces},
          {"parameters", rows}};
}

ExitCode runLooks(const LooksOptions& options) {
  if (options.markdown) {
    fmt::print("{}", filtersPage());
    return ExitCode::allDone;
  }
  std::size_t nameWidth = 0, displayWidth = 0;
  for (const FilterDescription* look : allFilters()) {
    nameWidth = std::max(nameWidth, look->name.size());
    displayWidth = std::max(displayWidth, look->displayName.size());
  }
  JsonOutput json(options.report, false);
  for (const FilterDescription* look : allFilters()) {
    json.add(jsonOf(*look));
    if (json.wanted()) continue;
    fmt::print("{:{}}  {:{}}  {}\n", look->name, nameWidth, look->displayName, displayWidth,
               look->description);
  }
  return ExitCode::allDone;
}

}  // namespace

void addLooks(CommandLine& commandLine) {
  const auto options = std::make_shared<LooksOptions>();
  Verb verb = commandLine.addVerb("looks", "List the looks: name, display name and description",
                                  "quenby looks\n"
                                  "quenby looks --json",
                                  [options] { return runLooks(*options); });
  Option json = verb.flag("--json", options->report.json,
                          "Print the list as a JSON array, with the parameters of each look");
  Option lines = verb.flag("--jsonl", options->report.jsonLines, "The same, one look a line");
  Option page = verb.flag("--markdown", options->markdown, "Print the list as a page to read");
  lines.excludes(json);
  page.excludes(json).excludes(lines);
}

}  // namespace pelorin::cli
