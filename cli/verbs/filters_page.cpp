#include "cli/verbs/filters_page.h"

#include <fmt/format.h>

#include "cli/frame/filter_options.h"
#include "cli/frame/look_name.h"
#include "image_processing/filters/parameter_check.h"

namespace pelorin::cli {
namespace {

using image_processing::FilterDescription;
using image_processing::FilterParameter;
using image_processing::FilterParameters;
using image_processing::ParameterReader;

constexpr const char* introduction =
    "# Filters\n\n"
    "`quenby looks --markdown` prints this page, `quenby looks --json` the same for programs.\n\n"
    "A filter takes its parameters as one text of `key=value;` items, as in `\"slider=0.4;\"`; "
    "keys\n"
    "that it does not have are ignored, and of several items with one key the last counts. The\n"
    "command's options write that text for you and refuse what a filter would not take for what "
    "it\n"
    "is; `image_processing::checkParameters` does so for programs.\n\n";

constexpr const char* strictReader =
    "Booleans are `true` and `false`, anything else is false. A number must be one as a whole.\n";
constexpr const char* lenientReader =
    "Booleans are 0 and 1. A number is what the text begins with, 0 where that is none. An item\n"
    "without its `;` is ignored, and so is a number of a list without its `,`.\n";

std::string rowOf(const FilterParameter& row, ParameterReader reader) {
  std::string standard = "the look's own";
  if (row.required) standard = "required";
  if (!row.required && row.standard) standard = valueText(row, reader, *row.standard);
  const std::string condition =
      row.onlyWith.empty() ? "" : fmt::format("; only with `{}`", row.onlyWith);
  return fmt::format("| `{}` | {} | {} | `{}` | {}{} |\n", row.name, wantedValue(row, reader),
                     standard, optionFor(row.name), row.description, condition);
}

std::string sectionOf(const FilterDescription& filter) {
  const FilterParameters parameters = filter.parameters();
  std::string section = fmt::format("\n## {}, shown as {}\n\n{}\n", filter.name, filter.displayName,
                                    filter.description);
  section += parameters.readsFaces ? "\nFace boxes change the result.\n" : "";
  if (parameters.rows.empty()) return section + "\nIt takes no parameters.\n";
  section += parameters.readsFaces ? "" : "\n";
  section += parameters.reader == ParameterReader::filterParams ? strictReader : lenientReader;
  section += "\n| Key | Value | Without it | Option | Meaning |\n|---|---|---|---|---|\n";
  for (const FilterParameter& row : parameters.rows) section += rowOf(row, parameters.reader);
  return section;
}

}  // namespace

std::string filtersPage() {
  std::string page = introduction;
  page += "| Filter | Shown as | What it does |\n|---|---|---|\n";
  for (const FilterDescription* filter : allFilters()) {
    page +=
        fmt::format("| `{}` | {} | {} |\n", filter->name, filter->displayName, filter->description);
  }
  for (const FilterDescription* filter : allFilters()) page += sectionOf(*filter);
  return page;
}

}  // namespace pelorin::cli
