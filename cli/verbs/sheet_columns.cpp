#include "cli/verbs/sheet_columns.h"

#include <fmt/format.h>

#include <algorithm>

#include "cli/frame/look_name.h"
#include "cli/frame/number_text.h"
#include "image_processing/filters/default_filter_factory.h"

namespace pelorin::cli {
namespace {

using image_processing::FilterDescription;

const std::string untouched = "PassThrough";
const std::string enhancement = "AE0";

std::string sliderParams(float slider) {
  return fmt::format("slider={:.9g};", slider);
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
}

std::vector<SheetColumn> sheetColumns(const SheetColumnOptions& options) {
  const std::string params = sliderParams(readSlider("--slider", options.slider));
  std::vector<SheetColumn> columns;
  const auto addLook = [&](const FilterDescription& look) {
    if (look.name != untouched) columns.push_back({labelOf(look), look.name, params});
  };
  if (options.allLooks || (options.looks.empty() && options.sliders.empty())) {
    const auto registry = image_processing::DefaultFilterFactory::filterFactory();
    for (const auto& [name, look] : registry->descriptions) addLook(*look);
  }
  for (const std::string& name : options.looks) addLook(lookNamed(name));
  for (const std::string& text : options.sliders) {
    const float slider = readSlider("--sliders", text);
    columns.push_back({fmt::format("slider {:g}", slider), enhancement, sliderParams(slider)});
  }
  return columns;
}

std::string titleOf(const std::vector<SheetColumn>& columns) {
  const bool onlySliders =
      std::all_of(columns.begin(), columns.end(),
                  [](const SheetColumn& column) { return column.filter == enhancement; });
  return onlySliders ? "Automatic enhancement" : "Looks";
}

}  // namespace pelorin::cli
