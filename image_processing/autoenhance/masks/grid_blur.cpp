#include "image_processing/autoenhance/masks/grid_blur.h"

namespace pelorin::image_processing {
namespace {

/// Blurs `count` cells that lie `stride` cells apart. `before` holds a copy of the line while it is
/// overwritten.
void blurLine(GridCell* cells, std::int64_t count, std::int64_t stride,
              std::vector<GridCell>& before) {
  const GaussianApproximation<float> kernel = spatialBell();
  for (std::int64_t i = 0; i < count; ++i) before[i] = cells[i * stride];
  for (std::int64_t i = 0; i < count; ++i) {
    GridCell sums;
    for (std::int64_t offset = -2; offset <= 2; ++offset) {
      const GridCell& neighbour = before[reflectInto(i + offset, count)];
      const float weight = kernel(static_cast<float>(offset));
      for (std::int32_t bin = 0; bin < gridBins; ++bin) {
        sums[bin].value += weight * neighbour[bin].value;
        sums[bin].weight += weight * neighbour[bin].weight;
      }
    }
    cells[i * stride] = sums;
  }
}

void blurSpatially(Grid& grid) {
  std::vector<GridCell> line(std::max(grid.columns, grid.rows));
  for (std::int64_t y = 0; y < grid.rows; ++y) blurLine(grid.row(y), grid.columns, 1, line);
  for (std::int64_t x = 0; x < grid.columns; ++x) {
    blurLine(grid.row(0) + x, grid.rows, grid.columns, line);
  }
}

void blurLightness(Grid& grid, float sigmaRange) {
  const std::int64_t radius = rangeRadius(sigmaRange);
  const GaussianApproximation<float> kernel = rangeBell(radius);
  // The bell at -d, for d from -31 to 31: in float it is not the bell at d for many offsets.
  std::array<float, 2 * gridBins - 1> weights;
  for (std::int32_t d = 1 - gridBins; d < gridBins; ++d) {
    weights[d + gridBins - 1] = kernel(static_cast<float>(-d));
  }
  for (GridCell& cell : grid.cells) {
    const GridCell before = cell;
    for (std::int64_t bin = 0; bin < gridBins; ++bin) {
      GridNode sum;
      const std::int64_t last = std::min(gridBins - 1 - bin, radius);
      for (std::int64_t d = std::max(-bin, -radius); d <= last; ++d) {
        const float weight = weights[d + gridBins - 1];
        sum.value += weight * before[bin + d].value;
        sum.weight += weight * before[bin + d].weight;
      }
      cell[bin] = sum;
    }
  }
}

}  // namespace

void blurScalar(Grid& grid, float sigmaRange) {
  blurSpatially(grid);
  blurLightness(grid, sigmaRange);
}

}  // namespace pelorin::image_processing
