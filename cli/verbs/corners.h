#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "image_processing/core/rows.h"
#include "image_processing/features/brief.h"

namespace pelorin::cli {

/// How corners are looked for.
struct CornerSearch {
  int arc = 9;  ///< Neighbouring circle pixels that must differ, 9 ... 12.
  int threshold = 20;
  bool suppressed = true;  ///< Only corners that score higher than all their neighbours.
  bool described = false;  ///< With descriptors.
};

using Descriptor = std::array<std::uint32_t, 8>;

struct Corner {
  xy position;
  int score;                             ///< The largest threshold at which it still is one.
  std::optional<Descriptor> descriptor;  ///< None within 15 pixels of a border.
};

/// The FAST corners of a picture in raster order, found in its green channel, of which some hundred
/// rows are held.
/// @throws std::bad_alloc, and what the source throws.
std::vector<Corner> findCorners(std::uint32_t width, std::uint32_t height,
                                image_processing::RowSource& rows, const CornerSearch& search);

/// 64 hexadecimal digits, bit 255 first.
std::string hexOf(const Descriptor& descriptor);

}  // namespace pelorin::cli
