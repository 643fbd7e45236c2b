#pragma once

#include <array>
#include <cstdint>
#include <vector>

#include "image_processing/autoenhance/masks/grid.h"
#include "image_processing/core/image.h"

namespace pelorin::image_processing {

/// Adds every pixel to its nearest node: its lightness to the value, 1 to the weight. A node adds
/// up its pixels in raster order.
/// @param cellSize  pixels, at least 1.
/// May throw std::bad_alloc.
void splat(const Image<float>& lightness, float cellSize, Grid& grid);

/// The definition of `splat`.
void splatScalar(const Image<float>& lightness, float cellSize, Grid& grid);

/// `splat` a row at a time, from the top.
class GridSplatter {
 public:
  /// Holds on to `grid`. @throws std::bad_alloc.
  GridSplatter(Grid& grid, std::uint32_t width, float cellSize);

  /// Adds row `y`. Uses the splatter's own memory, so one row at a time. Never throws.
  void addRow(std::uint32_t y, const float* lightness);

  /// Neighbouring pixels mostly meet in one node, and each sum waits for the one before it; so
  /// several strips of a row are added side by side. No column of the grid is in two of them: every
  /// node still sees its own pixels in order.
  static constexpr std::size_t strips = 8;

 private:
  Grid& grid_;
  float cellSize_;
  std::vector<std::uint32_t> firstNodes_;  // of each pixel's column, counted from the row's first
  std::vector<std::uint32_t> nodes_;       // of the current row's pixels
  std::array<std::uint32_t, strips + 1> starts_;
};

}  // namespace pelorin::image_processing
