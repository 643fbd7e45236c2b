#include "image_processing/autoenhance/masks/grid_slice.h"

#include "image_processing/autoenhance/masks/trilerp.h"

namespace pelorin::image_processing {

template <typename T>
void sliceScalar(const Grid& grid, const Image<float>& lightness, float cellSize,
                 Image<T>& smoothed) {
  for (std::uint32_t y = 0; y < lightness.height; ++y) {
    const GridNeighbours rows(y, cellSize, grid.rows);
    const GridCell* const upper = grid.row(rows.before);
    const GridCell* const lower = grid.row(rows.after);
    const float* const in = lightness.row(y);
    T* const out = smoothed.row(y);
    for (std::uint32_t x = 0; x < lightness.width; ++x) {
      const GridNeighbours columns(x, cellSize, grid.columns);
      const float place = in[x] * lastGridBin;
      const std::int32_t b0 = std::clamp(truncateTo<std::int32_t>(place), 0, gridBins - 1);
      const std::int32_t b1 = reflect(b0 + 1, gridBins);
      const float fraction = place - static_cast<float>(b0);
      const auto interpolated = [&](float GridNode::*part) {
        return trilerp(upper[columns.before][b0].*part, lower[columns.before][b0].*part,
                       upper[columns.after][b0].*part, lower[columns.after][b0].*part,
                       upper[columns.before][b1].*part, lower[columns.before][b1].*part,
                       upper[columns.after][b1].*part, lower[columns.after][b1].*part,
                       rows.fraction, columns.fraction, fraction);
      };
      const float value = interpolated(&GridNode::value);
      const float weight = interpolated(&GridNode::weight);
      out[x] = weight > 0.0f ? value / weight : value;
    }
  }
}

template void sliceScalar(const Grid&, const Image<float>&, float, Image<float>&);
template void sliceScalar(const Grid&, const Image<float>&, float,
                          Image<QuantizedFloat<unsigned char>>&);

}  // namespace pelorin::image_processing
