#pragma once

#include <cstdint>
#include <memory>

#include "photo/rows.h"

namespace pelorin::photo {

/// The rows of `reader` at 1/`divisor` of the size, rounded up: each pixel is the average of a block
/// of `divisor` x `divisor`, of what there is of it at the right and at the bottom, rounded to
/// nearest. Transparent pixels count by as much as can be seen of them.
std::unique_ptr<RowReader> reducedRows(std::unique_ptr<RowReader> reader, std::uint32_t divisor);

}  // namespace pelorin::photo
