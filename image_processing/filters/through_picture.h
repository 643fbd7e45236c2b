#pragma once

#include <functional>
#include <memory>

#include "image_processing/filters/abstract_filter.h"
#include "image_processing/filters/row_filter.h"

namespace pelorin::image_processing {

/// A row filter of a filter that knows whole pictures only: it collects one.
/// @param makeFilter  makes the filter, not initialised, in a session of its own.
std::unique_ptr<RowFilter> throughPicture(
    std::function<std::unique_ptr<AbstractFilter>(std::shared_ptr<FilteredImageState>&)> makeFilter,
    RowRequest request);

}  // namespace pelorin::image_processing
