#include "cli/verbs/sheet_columns.h"

#include <fmt/format.h>

#include <algorithm>

#include "cli/frame/filter_options.h"
#include "cli/frame/look_name.h"
#include "image_processing/core/parameter_strings.h"
#include "image_processing/filters/parameter_check.h"

namespace pelorin::cli {
namespace {

using image_processing::FilterDescription;

const std::string untouched = "PassThrough";
const std::string enhancement = "AE0";

/// What the filter reads when the user gives `slider` to `option`.
std::string sliderParams(const FilterDescription& filter, const std::string& option,
                         const std::string& slider) {
  if (filter.parameters().find("slider") == nullptr) return requiredParameters(filter.parameters());
  return parameterItem(filter, "slider", option, slider);
}

/// The display name, with the registry name behind it when another filter shows the same.
std::string labelOf(const FilterDescription& look) {
  const bool unique = othersShownAs(look).empty();
  return unique ? look.displayName : look.displayName + " (" + look.name + ")";
}

}  // namespace

void addSheetColumnOptions(Verb verb, SheetColumnOptions& options) {
  Option all = verb.flag("--all-looks", options.allLooks,
                         "A column for every look; so it is when none is named");
  verb.option("--looks", options.looks, "A column for each of these looks")
      .separatedBy(',')
      .type("NAME,...")
      .excludes(all);
  verb.option("--sliders", options.sliders,
              "A column of the automatic enhancement at each of these sliders")
      .separatedBy(',')
      .type("NUMBER,...");
  verb.option("--slider", options.slider,
              "Strength of the automatic enhancement among the looks; 0.4 unless given")
      .type("NUMBER");
  verb.flag("--without-faces", options.withoutFaces,
            "Before each column that cares for faces, another one as if the photo had none");
}

std::vector<SheetColumn> sheetColumns(const SheetColumnOptions& options) {
  const FilterDescription& automatic = filterNamed(enhancement);
  sliderParams(automatic, "--slider", options.slider);  // refused also when no look reads it
  std::vector<SheetColumn> columns;
  const auto add = [&](const SheetColumn& column) {
    if (options.withoutFaces && column.filter->parameters().readsFaces)
      columns.push_back({column.label + ", no faces", column.filter, column.params, false});
    columns.push_back(column);
  };
  const auto addLook = [&](const FilterDescription& look) {
    if (look.name == untouched) return;
    add({labelOf(look), &look, sliderParams(look, "--slider", options.slider)});
  };
  if (options.allLooks || (options.looks.empty() && options.sliders.empty())) {
    for (const FilterDescription* look : allFilters()) addLook(*look);
  }
  for (const std::string& name : options.looks) addLook(lookNamed(name));
  for (const std::string& text : options.sliders) {
    const std::string params = sliderParams(automatic, "--sliders", text);
    const float slider = image_processing::FilterParams(params).readFloat("slider");
    add({fmt::format("slider {:g}", slider), &automatic, params});
  }
  return columns;
}

std::string titleOf(const std::vector<SheetColumn>& columns) {
  const bool onlySliders =
      std::all_of(columns.begin(), columns.end(),
                  [](const SheetColumn& column) { return column.filter->name == enhancement; });
  return onlySliders ? "Automatic enhancement" : "Looks";
}

}  // namespace pelorin::cli
