#pragma once

#include <algorithm>
#include <array>
#include <cstdint>
#include <limits>
#include <new>
#include <vector>

#include "image_processing/autoenhance/masks/mirror.h"
#include "image_processing/core/checked_size.h"
#include "image_processing/core/float_to_integer.h"

namespace pelorin::image_processing {

/// Steps of the grid's lightness axis.
inline constexpr std::int32_t gridBins = 32;

/// The last of them, which holds lightness 1.
inline constexpr float lastGridBin = gridBins - 1;

/// What the pixels near one place and of about one lightness add up to.
struct GridNode {
  float value = 0.0f;
  float weight = 0.0f;
};

/// The nodes of one place, dark to light. Whole cache lines, so that no vector lies across two.
struct alignas(64) GridCell : std::array<GridNode, gridBins> {};

/// The bilateral grid: cells in one block, the top row first. Cell (row, column) stands for the
/// pixel position (row, column) times the cell size.
struct Grid {
  /// All nodes 0. @throws std::bad_alloc, also when a row has 2^32 nodes.
  Grid(std::int64_t across, std::int64_t down)
      : columns(across), rows(down), cells(cellCount(across, down)) {}

  GridCell* row(std::int64_t y) { return &cells[y * columns]; }
  const GridCell* row(std::int64_t y) const { return &cells[y * columns]; }

  std::int64_t columns, rows;
  std::vector<GridCell> cells;

 private:
  static std::size_t cellCount(std::int64_t across, std::int64_t down) {
    if (across > std::numeric_limits<std::uint32_t>::max() / gridBins) throw std::bad_alloc();
    return checkedProduct(across, std::uint64_t(down), sizeof(GridCell)) / sizeof(GridCell);
  }
};

/// The node nearest to a pixel position, along an axis of `nodes`.
inline std::int64_t nearestNode(std::uint32_t position, float cellSize, std::int64_t nodes) {
  const float node = static_cast<float>(position) / cellSize + 0.5f;
  return truncateTo<std::int32_t>(std::clamp(node, 0.0f, static_cast<float>(nodes - 1)));
}

/// The nodes before and after a pixel position, and how far it lies between them. Beyond the last
/// node both are that node, and the fraction may be above 1 without harm.
struct GridNeighbours {
  GridNeighbours(std::uint32_t position, float cellSize, std::int64_t nodes) {
    const float place = static_cast<float>(position) / cellSize;
    before = std::clamp<std::int64_t>(truncateTo<std::int32_t>(place), 0, nodes - 1);
    after = reflect(before + 1, nodes);
    fraction = place - static_cast<float>(before);
  }

  std::int64_t before, after;
  float fraction;
};

}  // namespace pelorin::image_processing
