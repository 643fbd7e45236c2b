#include "image_processing/autoenhance/masks/flatness_mask.h"

#include <algorithm>
#include <cstddef>
#include <vector>

#include "image_processing/autoenhance/colour/colour_tables.h"
#include "image_processing/autoenhance/masks/flatness_rows.h"
#include "image_processing/autoenhance/masks/mirror.h"

namespace pelorin::image_processing {

// The window sums come from a summed-area table over the padded weights. It is formed in float, in
// one fixed order, and at large sizes its rounding shows in the mask: a sliding window or double
// sums would give other photos. Only the rows that a window spans are kept.
template <typename TB, typename TL>
void computeFlatnessMaskScalar(const Image<float>& lightness, const Image<TB>& smoothed, int radius,
                               Image<TL>& mask) {
  if (lightness.pixelCount() == 0) return;
  if (radius < 0) {
    TL none;
    none = 0.0f;
    mask.set(none);
    return;
  }

  const std::int64_t width = lightness.width, height = lightness.height, r = radius;
  const std::int64_t n = 2 * r + 1;
  const GaussianApproximation<float> weight = flatnessWeight(n);
  const MonotonicTable<float>& shaped = colourTables().flatness;

  const std::int64_t tableWidth = width + n;
  const std::int64_t keptRows = n + 1;
  std::vector<float> sums(checkedProduct(tableWidth, std::uint64_t(keptRows)));
  const auto tableRow = [&](std::int64_t i) { return &sums[(i % keptRows) * tableWidth]; };

  std::vector<float> weights(width);
  std::vector<float> zeros(tableWidth);
  const float* above = zeros.data();
  for (std::int64_t i = 0; i < height + n; ++i) {
    const auto source = static_cast<std::uint32_t>(reflectInto(i - r, height));
    const float* const detailed = lightness.row(source);
    const TB* const base = smoothed.row(source);
    for (std::int64_t x = 0; x < width; ++x) {
      weights[x] = weight(detailed[x] - static_cast<float>(base[x]));
    }

    float* const row = tableRow(i);
    // Left of the first column stands its mirror image, column 1: still zero in this row.
    float left = 0.0f;
    float aboveLeft = above[1];
    for (std::int64_t j = 0; j < tableWidth; ++j) {
      const float sum = ((weights[reflectInto(j - r, width)] + above[j]) + left) - aboveLeft;
      row[j] = sum;
      left = sum;
      aboveLeft = above[j];
    }
    above = row;

    const std::int64_t y = i - n;
    if (y < 0) continue;
    const float* const top = tableRow(y);
    TL* const out = mask.row(static_cast<std::uint32_t>(y));
    for (std::int64_t x = 0; x < width; ++x) {
      const float share = ((top[x] + row[x + n]) - row[x]) - top[x + n];
      out[x] = shaped(share);
    }
  }
}

template void computeFlatnessMaskScalar(const Image<float>&, const Image<float>&, int,
                                        Image<float>&);
template void computeFlatnessMaskScalar(const Image<float>&,
                                        const Image<QuantizedFloat<unsigned char>>&, int,
                                        Image<QuantizedFloat<unsigned char>>&);

}  // namespace pelorin::image_processing
