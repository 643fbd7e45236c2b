#pragma once

#include <cstdint>
#include <span>
#include <utility>
#include <vector>

namespace pelorin::imgproc {

struct Place {
  std::uint32_t row, column;
};

/// What becomes of a picture: the order of its rows and of its columns is reversed, then they are
/// exchanged.
struct Turn {
  bool reversesRows, reversesColumns, swapsAxes;

  /// Where a place of the turned picture lies in the picture of rows x columns.
  Place sourceOf(Place turned, std::uint32_t rows, std::uint32_t columns) const {
    if (swapsAxes) std::swap(turned.row, turned.column);
    return {reversesRows ? rows - 1 - turned.row : turned.row,
            reversesColumns ? columns - 1 - turned.column : turned.column};
  }
};

/// Turns a picture of which nothing can be moved without loss: decodes it, and encodes it again in
/// the same colours, at quality 100 and with every channel whole. Segments are kept.
std::vector<std::uint8_t> turnPixels(std::span<const std::uint8_t> file, const Turn& turn);

}  // namespace pelorin::imgproc
