#include <cstddef>
#include <cstring>

#include "image_processing/autoenhance/grid_splat.h"

namespace pelorin::image_processing {
namespace {

// A row is a run of pixels for each cell. Neighbouring pixels mostly meet in one node, and each sum
// waits for the one before it; so several runs are added side by side. Every node still sees its
// own pixels in raster order.
constexpr std::size_t runsAtOnce = 4;

/// First pixel of each cell's run, and the width behind them.
std::vector<std::uint32_t> runStarts(std::uint32_t width, float cellSize, std::int64_t columns) {
  std::vector<std::uint32_t> starts(columns + 1, width);
  for (std::uint32_t x = width; x-- > 0;) starts[nearestNode(x, cellSize, columns)] = x;
  for (std::int64_t column = columns; column-- > 0;) {  // a cell without pixels
    starts[column] = std::min(starts[column], starts[column + 1]);
  }
  return starts;
}

void findBins(const float* lightness, std::uint8_t* bins, std::size_t count) {
  for (std::size_t i = 0; i < count; ++i) {
    const float bin = lightness[i] * 31.0f + 0.5f;
    const float held = bin > 0.0f ? bin : 0.0f;  // NaN as well
    bins[i] = static_cast<std::uint8_t>(static_cast<std::int32_t>(held < 31.0f ? held : 31.0f));
  }
}

/// One addition for value and weight together.
inline void addTo(GridNode& node, float value) {
  typedef float Pair __attribute__((vector_size(8)));
  Pair sums;
  std::memcpy(&sums, &node, sizeof sums);
  sums += Pair{value, 1.0f};
  node = {sums[0], sums[1]};
}

struct Run {
  GridNode* nodes;
  const float* lightness;
  const std::uint8_t* bins;
  std::size_t length;

  void add(std::size_t i) const { addTo(nodes[bins[i]], lightness[i]); }
};

}  // namespace

void splat(const Image<float>& lightness, float cellSize, Grid& grid) {
  const std::vector<std::uint32_t> starts = runStarts(lightness.width, cellSize, grid.columns);
  std::vector<std::uint8_t> bins(lightness.width);
  for (std::uint32_t y = 0; y < lightness.height; ++y) {
    GridCell* const cells = grid.row(nearestNode(y, cellSize, grid.rows));
    const float* const row = lightness.row(y);
    findBins(row, bins.data(), lightness.width);
    for (std::int64_t column = 0; column < grid.columns; column += runsAtOnce) {
      Run runs[runsAtOnce];
      std::size_t shared = lightness.width;
      for (std::size_t i = 0; i < runsAtOnce; ++i) {
        const std::int64_t at = std::min<std::int64_t>(column + i, grid.columns);
        const std::uint32_t first = starts[at];
        const std::uint32_t end = at < grid.columns ? starts[at + 1] : first;
        runs[i] = {at < grid.columns ? cells[at].data() : nullptr, row + first, &bins[0] + first,
                   end - first};
        shared = std::min(shared, runs[i].length);
      }
      const auto [a, b, c, d] = runs;
      for (std::size_t i = 0; i < shared; ++i) {
        a.add(i);
        b.add(i);
        c.add(i);
        d.add(i);
      }
      for (const Run& run : runs) {
        for (std::size_t i = shared; i < run.length; ++i) run.add(i);
      }
    }
  }
}

}  // namespace pelorin::image_processing
