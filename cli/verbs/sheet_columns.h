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
  bool withoutFaces = false;
};

/// Adds `--all-looks`, `--looks`, `--sliders`, `--slider` and `--without-faces` to a verb.
void addSheetColumnOptions(Verb verb, SheetColumnOptions& options);

/// One way of treating every photo.
struct SheetColumn {
  std::string label;
  const image_processing::FilterDescription* filter;
  std::string params;
  bool faces = true;  ///< Whether the filter is told of them.
};

/// The looks in the order they were named, or all of the registry, then the automatic enhancement
/// at each slider; all looks when nothing was asked for. The untouched photo is not among them. With
/// `withoutFaces`, a column whose filter reads faces has one before it that is told of none.
/// @throws UsageError for names that are no look and sliders that are no number.
std::vector<SheetColumn> sheetColumns(const SheetColumnOptions& options);

/// What to write above a sheet of these columns.
std::string titleOf(const std::vector<SheetColumn>& columns);

}  // namespace pelorin::cli
