#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "cli/pictures/annotated_photo.h"

namespace pelorin::cli {

/// A value for each square block of a photo.
struct BlockValues {
  std::uint32_t blockSize;      ///< In pixels of the photo.
  std::uint32_t columns, rows;  ///< From its top left; all blocks lie inside the photo.
  std::vector<float> values;    ///< In raster order.
};

/// The photo with each block tinted by its value. What no block covers, and blocks whose value is
/// not finite, keep the photo's muted colours.
/// @param label  what the colours stand for.
/// @throws std::bad_alloc when the picture does not fit into memory.
AnnotatedPhoto::Photo drawHeatMap(const ShownPhoto& photo, const BlockValues& blocks,
                                  const std::string& title, const std::string& subtitle,
                                  const std::string& label);

}  // namespace pelorin::cli
