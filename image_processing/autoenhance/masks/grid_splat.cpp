#include "image_processing/autoenhance/masks/grid_splat.h"

namespace pelorin::image_processing {

void splatScalar(const Image<float>& lightness, float cellSize, Grid& grid) {
  std::vector<std::int64_t> columnOf(lightness.width);
  for (std::uint32_t x = 0; x < lightness.width; ++x) {
    columnOf[x] = nearestNode(x, cellSize, grid.columns);
  }
  for (std::uint32_t y = 0; y < lightness.height; ++y) {
    GridCell* const cells = grid.row(nearestNode(y, cellSize, grid.rows));
    const float* const row = lightness.row(y);
    for (std::uint32_t x = 0; x < lightness.width; ++x) {
      const float value = row[x];
      const float bin = std::clamp(value * lastGridBin + 0.5f, 0.0f, lastGridBin);
      GridNode& node = cells[columnOf[x]][truncateTo<std::int32_t>(bin)];
      node.value += value;
      node.weight += 1.0f;
    }
  }
}

}  // namespace pelorin::image_processing
