#include "image_processing/autoenhance/masks/flatness_rows.h"

#include <algorithm>

#include "image_processing/autoenhance/colour/colour_tables.h"
#include "image_processing/core/float_to_integer.h"

namespace pelorin::image_processing {

using Quantized = QuantizedFloat<unsigned char>;

GaussianApproximation<float> flatnessWeight(std::int64_t side) {
  constexpr float noDetail = 20.0f / 255.0f;
  const auto n = static_cast<std::uint64_t>(side);
  return {-noDetail, noDetail, 0.0f, 1.0f / static_cast<float>(n * n)};
}

template <typename T>
void weighRowScalar(const GaussianApproximation<float>& weight, const float* lightness,
                    const T* smoothed, float* weights, std::size_t count) {
  for (std::size_t x = 0; x < count; ++x) {
    weights[x] = weight(lightness[x] - static_cast<float>(smoothed[x]));
  }
}

FlatnessShape::FlatnessShape() : samples(colourTables().flatness.samples()), codes(samples.size()) {
  std::transform(samples.begin(), samples.end(), codes.begin(), [](float sample) {
    Quantized stored;
    stored = sample;
    return stored.stored();
  });
}

template <typename T>
void shapeRowScalar(const float* top, const float* bottom, std::ptrdiff_t n,
                    const FlatnessShape& shape, T* mask, std::size_t count) {
  const auto last = static_cast<std::int32_t>(shape.samples.size() - 1);
  for (std::size_t x = 0; x < count; ++x) {
    const float share = ((top[x] + bottom[x + n]) - bottom[x]) - top[x + n];
    const auto place = truncateTo<std::int32_t>(share * static_cast<float>(last));
    mask[x] = shape.samples[std::clamp(place, 0, last)];
  }
}

template void weighRowScalar(const GaussianApproximation<float>&, const float*, const float*,
                             float*, std::size_t);
template void weighRowScalar(const GaussianApproximation<float>&, const float*, const Quantized*,
                             float*, std::size_t);
template void shapeRowScalar(const float*, const float*, std::ptrdiff_t, const FlatnessShape&,
                             float*, std::size_t);
template void shapeRowScalar(const float*, const float*, std::ptrdiff_t, const FlatnessShape&,
                             Quantized*, std::size_t);

}  // namespace pelorin::image_processing
