#include "image_processing/autoenhance/masks/bilateral_grid.h"

#include <algorithm>

#include "image_processing/autoenhance/masks/grid.h"
#include "image_processing/autoenhance/masks/grid_blur.h"
#include "image_processing/autoenhance/masks/grid_slice.h"
#include "image_processing/autoenhance/masks/grid_splat.h"

namespace pelorin::image_processing {

float gridCellSize(float spatial) {
  return static_cast<float>(std::max(truncateTo<std::int32_t>(spatial), 1));
}

Grid makeGrid(std::uint32_t width, std::uint32_t height, float cellSize) {
  const auto cell = static_cast<std::int64_t>(cellSize);
  return Grid(std::max<std::int64_t>(width / cell, 1), std::max<std::int64_t>(height / cell, 1));
}

template <typename T>
void bilateralFilterGridApproximation(Image<float> lightness, float sigmaRange, float spatial,
                                      Image<T> smoothed) {
  if (lightness.pixelCount() == 0) return;
  const float cellSize = gridCellSize(spatial);
  Grid grid = makeGrid(lightness.width, lightness.height, cellSize);
  splat(lightness, cellSize, grid);
  blur(grid, sigmaRange);
  slice(grid, lightness, cellSize, smoothed);
}

template void bilateralFilterGridApproximation(Image<float>, float, float, Image<float>);
template void bilateralFilterGridApproximation(Image<float>, float, float,
                                               Image<QuantizedFloat<unsigned char>>);

}  // namespace pelorin::image_processing
