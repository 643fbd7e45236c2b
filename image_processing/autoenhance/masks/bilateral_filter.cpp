#include "image_processing/autoenhance/masks/bilateral_filter.h"

#include "image_processing/autoenhance/masks/gaussian_approximation.h"
#include "image_processing/autoenhance/masks/mirror.h"

namespace pelorin::image_processing {

template <typename T>
void bilateralFilter(const Image<float>& lightness, float sigmaRange, int radius,
                     Image<T>& smoothed, Workers* workers) {
  const std::int64_t width = lightness.width, height = lightness.height, r = radius;
  const float support = static_cast<float>(radius);
  const GaussianApproximation<float> rangeWeight(-sigmaRange, sigmaRange, 0.0f, 1.0f);
  const GaussianApproximation<float> spatialWeight(-support, support, 0.0f, 1.0f);
  runTasks(workers, lightness.height, [&](std::size_t row) {
    const auto y = static_cast<std::int64_t>(row);
    for (std::int64_t x = 0; x < width; ++x) {
      const float centre = lightness.row(static_cast<std::uint32_t>(y))[x];
      float weights = 0.0f;
      float values = 0.0f;
      for (std::int64_t dy = -r; dy <= r; ++dy) {
        const float* line = lightness.row(static_cast<std::uint32_t>(reflectInto(y + dy, height)));
        for (std::int64_t dx = -r; dx <= r; ++dx) {
          const float value = line[reflectInto(x + dx, width)];
          const float weight = rangeWeight(value - centre) * spatialWeight(static_cast<float>(dx));
          values += weight * value;
          weights += weight;
        }
      }
      smoothed.row(static_cast<std::uint32_t>(y))[x] = weights > 0.0f ? values / weights : centre;
    }
  });
}

template void bilateralFilter(const Image<float>&, float, int, Image<float>&, Workers*);
template void bilateralFilter(const Image<float>&, float, int,
                              Image<QuantizedFloat<unsigned char>>&, Workers*);

}  // namespace pelorin::image_processing
