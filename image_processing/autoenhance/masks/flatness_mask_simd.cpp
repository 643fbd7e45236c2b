#include <algorithm>
#include <cstddef>
#include <vector>

#include "image_processing/autoenhance/masks/flatness_mask.h"
#include "image_processing/autoenhance/masks/flatness_rows.h"
#include "image_processing/autoenhance/masks/mirror.h"
#include "image_processing/autoenhance/masks/summed_area_rows.h"
#include "image_processing/core/checked_size.h"

namespace pelorin::image_processing {
namespace {

/// Rows of the summed-area table: as many as a window spans, and those being formed.
class SumRows {
 public:
  SumRows(std::int64_t width, std::int64_t window)
      // An odd number of cache lines a row: rows at the same place in a page would evict each
      // other.
      : stride_((((width + sumRowsPadding) / 16 + 1) | 1) * 16),
        // Whole groups, so that the rows of one follow each other.
        kept_((window + 2 * sumRowsAtOnce - 1) / sumRowsAtOnce * sumRowsAtOnce),
        sums_(checkedProduct(stride_, std::uint64_t(kept_), sizeof(float)) / sizeof(float)) {}

  std::int64_t stride() const { return stride_; }
  float* row(std::int64_t i) { return &sums_[(i % kept_) * stride_]; }

 private:
  std::int64_t stride_, kept_;
  std::vector<float> sums_;
};

}  // namespace

template <typename TB, typename TL>
void computeFlatnessMask(RowSource<float>& lightness, RowSource<TB>& smoothed, int radius,
                         Image<TL>& mask) {
  if (mask.pixelCount() == 0) return;
  if (radius < 0) {
    TL none;
    none = 0.0f;
    mask.set(none);
    return;
  }
  const std::int64_t width = mask.width, height = mask.height, r = radius;
  const std::int64_t n = 2 * r + 1;
  const GaussianApproximation<float> weight = flatnessWeight(n);

  const FlatnessShape shape;

  const std::int64_t tableWidth = width + n, tableHeight = height + n;
  SumRows table(tableWidth, n);
  const std::vector<float> zeros(table.stride());
  const float* above = zeros.data();

  const auto weighTableRow = [&](std::int64_t i) {
    const auto source = static_cast<std::uint32_t>(reflectInto(i - r, height));
    const TB* const base = smoothed.row(source);  // may want rows of lightness itself
    float* const weights = table.row(i);
    float* const middle = weights + r;
    weighRow(weight, lightness.row(source), base, middle, width);
    for (std::int64_t j = 0; j < r; ++j) weights[j] = middle[reflectInto(j - r, width)];
    for (std::int64_t j = r + width; j < tableWidth; ++j) {
      weights[j] = middle[reflectInto(j - r, width)];
    }
    std::fill_n(weights + tableWidth, sumRowsPadding, 0.0f);
  };

  for (std::int64_t i = 0; i < tableHeight; i += sumRowsAtOnce) {
    const std::int64_t end = std::min(i + sumRowsAtOnce, tableHeight);
    for (std::int64_t k = i; k < end; ++k) weighTableRow(k);
    sumRows(above, table.row(i), table.stride(), tableWidth);
    above = table.row(i + sumRowsAtOnce - 1);
    for (std::int64_t y = std::max<std::int64_t>(i - n, 0); y < end - n; ++y) {
      shapeRow(table.row(y), table.row(y + n), n, shape, mask.row(static_cast<std::uint32_t>(y)),
               width);
    }
  }
}

template <typename TB, typename TL>
void computeFlatnessMask(const Image<float>& lightness, const Image<TB>& smoothed, int radius,
                         Image<TL>& mask) {
  ImageRows<float> lightnessRows(lightness);
  ImageRows<TB> smoothedRows(smoothed);
  computeFlatnessMask<TB, TL>(lightnessRows, smoothedRows, radius, mask);
}

using Quantized = QuantizedFloat<unsigned char>;
template void computeFlatnessMask(RowSource<float>&, RowSource<float>&, int, Image<float>&);
template void computeFlatnessMask(RowSource<float>&, RowSource<Quantized>&, int, Image<Quantized>&);
template void computeFlatnessMask(const Image<float>&, const Image<float>&, int, Image<float>&);
template void computeFlatnessMask(const Image<float>&, const Image<Quantized>&, int,
                                  Image<Quantized>&);

}  // namespace pelorin::image_processing
