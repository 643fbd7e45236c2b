#pragma once

#include <string>
#include <vector>

#include "cli/frame/verb.h"
#include "image_processing/filters/filter_description.h"

namespace pelorin::cli {

/// What the user wants to see beside the original photos.
struct SheetColumnOptions {
  bool allLooks = false;
  std::vector<std::string> looks;
  std::vector<std::string> sliders;
  std::string slider = "0.4";
};

/// Adds `--all-looks`, `--looks`, `--sliders` and `--slider` to a verb.
void addSheetColumnOptions(Verb verb, SheetColumnOptions& options);

/// One way of treating every photo.
struct SheetColumn {
  std::string label;
  const image_processing::FilterDescription* filter;
  std::string params;
};

/// The looks in the order they were named, or all of the registry, then the automatic enhancement
/// at each slider; all looks when nothing was asked for. The untouched photo is not among them.
/// @throws UsageError for names that are no look and sliders that are no number.
std::vector<SheetColumn> sheetColumns(const SheetColumnOptions& options);

/// What to write above a sheet of these columns.
std::string titleOf(const std::vector<SheetColumn>& columns);

}  // namespace pelorin::cli
