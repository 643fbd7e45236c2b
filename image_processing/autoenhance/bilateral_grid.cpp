#include "image_processing/autoenhance/bilateral_grid.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <vector>

#include "image_processing/autoenhance/gaussian_approximation.h"
#include "image_processing/autoenhance/mirror.h"
#include "image_processing/autoenhance/trilerp.h"

namespace pelorin::image_processing {
namespace {

constexpr std::int32_t bins = 32;

/// What pixels near one place and of about one lightness add up to.
struct Node {
  float value = 0.0f;
  float weight = 0.0f;
};
using Cell = std::array<Node, bins>;

/// Cells in one block, the top row first.
struct Grid {
  Grid(std::int64_t columns, std::int64_t rows)
      : columns(columns), rows(rows), cells(checkedProduct(columns, std::uint64_t(rows))) {}

  Cell& at(std::int64_t row, std::int64_t column) { return cells[row * columns + column]; }

  std::int64_t columns, rows;
  std::vector<Cell> cells;
};

/// The nearest node of a pixel position.
std::int64_t nearestNode(std::uint32_t position, float cellSize, std::int64_t nodes) {
  const float node = static_cast<float>(position) / cellSize + 0.5f;
  return truncateTo<std::int32_t>(std::clamp(node, 0.0f, static_cast<float>(nodes - 1)));
}

/// The nodes before and after a pixel position, and how far it lies between them. Beyond the last
/// node both are that node, and the fraction may be above 1 without harm.
struct Neighbours {
  std::int64_t before, after;
  float fraction;

  Neighbours() = default;
  Neighbours(std::uint32_t position, float cellSize, std::int64_t nodes) {
    const float place = static_cast<float>(position) / cellSize;
    before = std::clamp<std::int64_t>(truncateTo<std::int32_t>(place), 0, nodes - 1);
    after = reflect(before + 1, nodes);
    fraction = place - static_cast<float>(before);
  }
};

void splat(const Image<float>& lightness, float cellSize, Grid& grid) {
  std::vector<std::int64_t> columnOf(lightness.width);
  for (std::uint32_t x = 0; x < lightness.width; ++x) {
    columnOf[x] = nearestNode(x, cellSize, grid.columns);
  }
  for (std::uint32_t y = 0; y < lightness.height; ++y) {
    Cell* const cells = &grid.at(nearestNode(y, cellSize, grid.rows), 0);
    const float* const row = lightness.row(y);
    for (std::uint32_t x = 0; x < lightness.width; ++x) {
      const float value = row[x];
      const float bin = std::clamp(value * 31.0f + 0.5f, 0.0f, 31.0f);
      Node& node = cells[columnOf[x]][truncateTo<std::int32_t>(bin)];
      node.value += value;
      node.weight += 1.0f;
    }
  }
}

/// Blurs `count` cells that lie `stride` cells apart with the five-tap bell. `before` holds a copy
/// of the line while it is overwritten.
void blurLine(Cell* cells, std::int64_t count, std::int64_t stride, std::vector<Cell>& before) {
  const GaussianApproximation<float> kernel(-2.0f, 2.0f, 0.0f, 1.0f);
  for (std::int64_t i = 0; i < count; ++i) before[i] = cells[i * stride];
  for (std::int64_t i = 0; i < count; ++i) {
    Cell sums;
    for (std::int64_t offset = -2; offset <= 2; ++offset) {
      const Cell& neighbour = before[reflectInto(i + offset, count)];
      const float weight = kernel(static_cast<float>(offset));
      for (std::int32_t bin = 0; bin < bins; ++bin) {
        sums[bin].value += weight * neighbour[bin].value;
        sums[bin].weight += weight * neighbour[bin].weight;
      }
    }
    cells[i * stride] = sums;
  }
}

void blurSpatially(Grid& grid) {
  std::vector<Cell> line(std::max(grid.columns, grid.rows));
  for (std::int64_t row = 0; row < grid.rows; ++row) {
    blurLine(&grid.at(row, 0), grid.columns, 1, line);
  }
  for (std::int64_t column = 0; column < grid.columns; ++column) {
    blurLine(&grid.at(0, column), grid.rows, grid.columns, line);
  }
}

void blurLightness(Grid& grid, float sigmaRange) {
  const std::int64_t radius = truncateTo<std::int32_t>(sigmaRange * static_cast<float>(bins));
  const float support = static_cast<float>(radius);
  const GaussianApproximation<float> kernel(-support, support, 0.0f, 1.0f);
  // The bell at -d, for d from -31 to 31: in float it is not the bell at d for many offsets.
  std::array<float, 2 * bins - 1> weights;
  for (std::int32_t d = 1 - bins; d < bins; ++d) {
    weights[d + bins - 1] = kernel(static_cast<float>(-d));
  }
  for (Cell& cell : grid.cells) {
    const Cell before = cell;
    for (std::int64_t bin = 0; bin < bins; ++bin) {
      Node sum;
      const std::int64_t last = std::min(bins - 1 - bin, radius);
      for (std::int64_t d = std::max(-bin, -radius); d <= last; ++d) {
        const float weight = weights[d + bins - 1];
        sum.value += weight * before[bin + d].value;
        sum.weight += weight * before[bin + d].weight;
      }
      cell[bin] = sum;
    }
  }
}

template <typename T>
void slice(Grid& grid, const Image<float>& lightness, float cellSize, Image<T>& smoothed) {
  std::vector<Neighbours> columns(lightness.width);
  for (std::uint32_t x = 0; x < lightness.width; ++x) {
    columns[x] = Neighbours(x, cellSize, grid.columns);
  }
  for (std::uint32_t y = 0; y < lightness.height; ++y) {
    const Neighbours rows(y, cellSize, grid.rows);
    const Cell* const upper = &grid.at(rows.before, 0);
    const Cell* const lower = &grid.at(rows.after, 0);
    const float* const in = lightness.row(y);
    T* const out = smoothed.row(y);
    for (std::uint32_t x = 0; x < lightness.width; ++x) {
      const Neighbours& column = columns[x];
      const float place = in[x] * 31.0f;
      const std::int32_t b0 = std::clamp(truncateTo<std::int32_t>(place), 0, bins - 1);
      const std::int32_t b1 = reflect(b0 + 1, bins);
      const float fraction = place - static_cast<float>(b0);
      const auto interpolated = [&](float Node::*part) {
        return trilerp(upper[column.before][b0].*part, lower[column.before][b0].*part,
                       upper[column.after][b0].*part, lower[column.after][b0].*part,
                       upper[column.before][b1].*part, lower[column.before][b1].*part,
                       upper[column.after][b1].*part, lower[column.after][b1].*part, rows.fraction,
                       column.fraction, fraction);
      };
      const float value = interpolated(&Node::value);
      const float weight = interpolated(&Node::weight);
      out[x] = weight > 0.0f ? value / weight : value;
    }
  }
}

}  // namespace

template <typename T>
void bilateralFilterGridApproximation(Image<float> lightness, float sigmaRange, float spatial,
                                      Image<T> smoothed) {
  if (lightness.pixelCount() == 0) return;
  const std::int64_t cellSize = std::max(truncateTo<std::int32_t>(spatial), 1);
  const float size = static_cast<float>(cellSize);
  Grid grid(std::max<std::int64_t>(lightness.width / cellSize, 1),
            std::max<std::int64_t>(lightness.height / cellSize, 1));
  splat(lightness, size, grid);
  blurSpatially(grid);
  blurLightness(grid, sigmaRange);
  slice(grid, lightness, size, smoothed);
}

template void bilateralFilterGridApproximation(Image<float>, float, float, Image<float>);
template void bilateralFilterGridApproximation(Image<float>, float, float,
                                               Image<QuantizedFloat<unsigned char>>);

}  // namespace pelorin::image_processing
