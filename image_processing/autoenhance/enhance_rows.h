#pragma once

#include <memory>

#include "image_processing/filters/row_filter.h"

namespace pelorin::image_processing {

/// Auto-enhance for one picture that comes as rows: one sweep finds its statistics and fills the
/// grid, another one makes the masks some rows at a time and enhances these. For Mask = float and
/// QuantizedFloat<unsigned char>, the masks' pixels.
/// @param request  with a grid in its configuration.
/// @throws what the parameters ask for: std::out_of_range for a missing one,
///         boost::bad_lexical_cast for an unreadable one.
template <typename Mask>
std::unique_ptr<RowFilter> enhanceRowFilter(const RowRequest& request);

}  // namespace pelorin::image_processing
