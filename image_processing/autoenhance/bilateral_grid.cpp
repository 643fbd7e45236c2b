#include "image_processing/autoenhance/bilateral_grid.h"

#include <algorithm>

#include "image_processing/autoenhance/grid.h"
#include "image_processing/autoenhance/grid_blur.h"
#include "image_processing/autoenhance/grid_slice.h"
#include "image_processing/autoenhance/grid_splat.h"

namespace pelorin::image_processing {

template <typename T>
void bilateralFilterGridApproximation(Image<float> lightness, float sigmaRange, float spatial,
                                      Image<T> smoothed) {
  if (lightness.pixelCount() == 0) return;
  const std::int64_t cellSize = std::max(truncateTo<std::int32_t>(spatial), 1);
  const float size = static_cast<float>(cellSize);
  Grid grid(std::max<std::int64_t>(lightness.width / cellSize, 1),
            std::max<std::int64_t>(lightness.height / cellSize, 1));
  splat(lightness, size, grid);
  blur(grid, sigmaRange);
  slice(grid, lightness, size, smoothed);
}

template void bilateralFilterGridApproximation(Image<float>, float, float, Image<float>);
template void bilateralFilterGridApproximation(Image<float>, float, float,
                                               Image<QuantizedFloat<unsigned char>>);

}  // namespace pelorin::image_processing
