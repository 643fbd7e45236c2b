#pragma once

#include <cstdint>
#include <memory>

#include "image_processing/filters/looks/look.h"
#include "image_processing/filters/row_filter.h"

namespace pelorin::image_processing {

/// A look for one picture that comes as rows.
/// @param vignette  what the look borrows, to be kept with it; may be null when it borrows none.
/// @throws std::bad_alloc.
std::unique_ptr<RowFilter> lookRowFilter(Look look, std::unique_ptr<CubicRadialMask> vignette,
                                         std::uint32_t width, std::uint32_t height);

}  // namespace pelorin::image_processing
