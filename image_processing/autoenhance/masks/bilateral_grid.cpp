#include "image_processing/autoenhance/masks/bilateral_grid.h"

#include <algorithm>

#include "image_processing/autoenhance/masks/grid.h"
#include "image_processing/autoenhance/masks/grid_blur.h"
#include "image_processing/autoenhance/masks/grid_slice.h"
#include "image_processing/autoenhance/masks/grid_splat.h"
#include "image_processing/core/require.h"

namespace pelorin::image_processing {
namespace {

/// Whether the blur in vectors may be trusted: it leaves out taps of weight 0, which matter beside
/// numbers that are not finite, and such as these stay finite on the way.
bool isOrdinary(const Grid& grid) {
  return std::ranges::all_of(grid.cells, [](const GridCell& cell) {
    return std::ranges::all_of(cell, [](const GridNode& node) {
      return node.value >= 0.0f && node.value <= 0x1p100f;  // false for NaN
    });
  });
}

template <typename T>
void requireRoom(const Image<float>& lightness, const Image<T>& smoothed) {
  require(smoothed.width == lightness.width && smoothed.height >= lightness.height,
          "grid filter: the output is not of the picture's size");
}

}  // namespace

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
  requireRoom(lightness, smoothed);
  if (lightness.pixelCount() == 0) return;
  const float cellSize = gridCellSize(spatial);
  Grid grid = makeGrid(lightness.width, lightness.height, cellSize);
  splat(lightness, cellSize, grid);
  if (!isOrdinary(grid)) {
    return bilateralFilterGridApproximationScalar(lightness, sigmaRange, spatial, smoothed);
  }
  blur(grid, sigmaRange);
  slice(grid, lightness, cellSize, smoothed);
}

template <typename T>
void bilateralFilterGridApproximationScalar(const Image<float>& lightness, float sigmaRange,
                                            float spatial, Image<T>& smoothed) {
  requireRoom(lightness, smoothed);
  if (lightness.pixelCount() == 0) return;
  const float cellSize = gridCellSize(spatial);
  Grid grid = makeGrid(lightness.width, lightness.height, cellSize);
  splatScalar(lightness, cellSize, grid);
  blurScalar(grid, sigmaRange);
  sliceScalar(grid, lightness, cellSize, smoothed);
}

template void bilateralFilterGridApproximation(Image<float>, float, float, Image<float>);
template void bilateralFilterGridApproximation(Image<float>, float, float,
                                               Image<QuantizedFloat<unsigned char>>);
template void bilateralFilterGridApproximationScalar(const Image<float>&, float, float,
                                                     Image<float>&);
template void bilateralFilterGridApproximationScalar(const Image<float>&, float, float,
                                                     Image<QuantizedFloat<unsigned char>>&);

}  // namespace pelorin::image_processing
