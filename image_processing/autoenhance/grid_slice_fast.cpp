#include <cstring>

#include "image_processing/autoenhance/grid_slice.h"
#include "image_processing/autoenhance/trilerp.h"

namespace pelorin::image_processing {
namespace {

/// A row of cells interpolated along y, once for all pixels of an image row, each with a copy of
/// its last node behind it: the neighbour of the lightest bin is that bin.
class InterpolatedRow {
 public:
  explicit InterpolatedRow(std::int64_t columns) : nodes_(columns * stride) {}

  void interpolate(const Grid& grid, const GridNeighbours& rows) {
    for (std::int64_t x = 0; x < grid.columns; ++x) {
      const GridNode* const upper = grid.row(rows.before)[x].data();
      const GridNode* const lower = grid.row(rows.after)[x].data();
      GridNode* const nodes = &nodes_[x * stride];
      for (std::int32_t bin = 0; bin < gridBins; ++bin) {
        nodes[bin] = {lerp(rows.fraction, upper[bin].value, lower[bin].value),
                      lerp(rows.fraction, upper[bin].weight, lower[bin].weight)};
      }
      nodes[gridBins] = nodes[gridBins - 1];
    }
  }

  /// The first node of a column.
  const GridNode* column(std::int64_t x) const { return &nodes_[x * stride]; }

 private:
  static constexpr std::int64_t stride = gridBins + 1;
  std::vector<GridNode> nodes_;
};

/// Where a pixel lies between two bins.
struct BinPlace {
  std::int32_t bin;
  float fraction;
};

void findBins(const float* lightness, BinPlace* places, std::size_t count) {
  for (std::size_t i = 0; i < count; ++i) {
    const float place = lightness[i] * 31.0f;
    const float above = place > 0.0f ? place : 0.0f;  // NaN as well
    const auto bin = static_cast<std::int32_t>(above < 31.0f ? above : 31.0f);
    places[i] = {bin, place - static_cast<float>(bin)};
  }
}

// Value and weight of two neighbouring bins: four floats that are always wanted together.
typedef float TwoNodes __attribute__((vector_size(16)));

inline TwoNodes load(const GridNode* nodes) {
  TwoNodes two;
  std::memcpy(&two, nodes, sizeof two);
  return two;
}

}  // namespace

template <typename T>
void slice(const Grid& grid, const Image<float>& lightness, float cellSize, Image<T>& smoothed) {
  const std::uint32_t width = lightness.width;
  std::vector<GridNeighbours> columns(width);
  for (std::uint32_t x = 0; x < width; ++x) columns[x] = {x, cellSize, grid.columns};
  InterpolatedRow row(grid.columns);
  std::vector<BinPlace> places(width);
  std::vector<float> values(width), weights(width);

  for (std::uint32_t y = 0; y < lightness.height; ++y) {
    row.interpolate(grid, {y, cellSize, grid.rows});
    findBins(lightness.row(y), places.data(), width);
    for (std::uint32_t x = 0; x < width; ++x) {
      const GridNeighbours& at = columns[x];
      const BinPlace& place = places[x];
      const TwoNodes before = load(row.column(at.before) + place.bin);
      const TwoNodes after = load(row.column(at.after) + place.bin);
      const TwoNodes between = (1.0f - at.fraction) * before + at.fraction * after;
      values[x] = lerp(place.fraction, between[0], between[2]);
      weights[x] = lerp(place.fraction, between[1], between[3]);
    }
    T* const out = smoothed.row(y);
    for (std::uint32_t x = 0; x < width; ++x) {
      const float quotient = values[x] / weights[x];
      out[x] = weights[x] > 0.0f ? quotient : values[x];
    }
  }
}

template void slice(const Grid&, const Image<float>&, float, Image<float>&);
template void slice(const Grid&, const Image<float>&, float, Image<QuantizedFloat<unsigned char>>&);

}  // namespace pelorin::image_processing
