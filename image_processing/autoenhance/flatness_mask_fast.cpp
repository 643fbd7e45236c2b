#include <algorithm>
#include <array>
#include <cstddef>
#include <vector>

#include "image_processing/autoenhance/colour_tables.h"
#include "image_processing/autoenhance/flatness_mask.h"
#include "image_processing/autoenhance/gaussian_approximation.h"
#include "image_processing/autoenhance/mirror.h"

namespace pelorin::image_processing {
namespace {

// Every sum of the table waits for the one to its left. Rows wait for the row above only column by
// column, so several advance together, each one column behind the row above it: the sum above is
// then what that row found a moment ago.
constexpr std::int64_t rowsAtOnce = 4;

/// Rows of the summed-area table, as many as a window spans and a step needs.
class SumRows {
 public:
  SumRows(std::int64_t width, std::int64_t kept)
      // An odd number of cache lines a row: rows at the same place in a page would evict each
      // other.
      : stride_(((width / 16 + 1) | 1) * 16),
        kept_(kept),
        sums_(checkedProduct(stride_, std::uint64_t(kept))) {}

  float* row(std::int64_t i) { return &sums_[(i % kept_) * stride_]; }

 private:
  std::int64_t stride_, kept_;
  std::vector<float> sums_;
};

struct SkewedRow {
  const float* weights;
  float* sums;
  float left, aboveLeft;

  /// The two first columns, alone: column 0 reads column 1 of the row above, its mirror image.
  void start(const float* above) {
    sums[0] = ((weights[0] + above[0]) + 0.0f) - above[1];
    sums[1] = ((weights[1] + above[1]) + sums[0]) - above[0];
    left = sums[1];
    aboveLeft = above[1];
  }

  void add(std::int64_t column, float above) {
    const float sum = ((weights[column] + above) + left) - aboveLeft;
    aboveLeft = above;
    left = sum;
    sums[column] = sum;
  }
};

void sumRows(std::array<SkewedRow, rowsAtOnce> rows, const float* above, std::int64_t width) {
  const float* aboveStart = above;
  for (SkewedRow& row : rows) {
    row.start(aboveStart);
    aboveStart = row.sums;
  }
  auto [a, b, c, d] = rows;  // copies: what the loop carries stays in registers
  const auto guarded = [width](SkewedRow& row, std::int64_t column, float aboveIt) {
    if (column >= 2 && column < width) row.add(column, aboveIt);
  };
  const auto step = [&](std::int64_t column) {
    // From the last row up: each still finds what the row above made one column earlier.
    guarded(d, column - 3, c.left);
    guarded(c, column - 2, b.left);
    guarded(b, column - 1, a.left);
    if (column < width) guarded(a, column, above[column]);
  };
  std::int64_t column = 2;
  for (; column < std::min<std::int64_t>(5, width + 3); ++column) step(column);
  for (; column < width; ++column) {
    d.add(column - 3, c.left);
    c.add(column - 2, b.left);
    b.add(column - 1, a.left);
    a.add(column, above[column]);
  }
  for (; column < width + 3; ++column) step(column);
}

}  // namespace

template <typename TB, typename TL>
void computeFlatnessMask(const Image<float>& lightness, const Image<TB>& smoothed, int radius,
                         Image<TL>& mask) {
  if (radius < 0 || lightness.pixelCount() == 0) {
    return computeFlatnessMaskScalar(lightness, smoothed, radius, mask);
  }
  const std::int64_t width = lightness.width, height = lightness.height, r = radius;
  const std::int64_t n = 2 * r + 1;
  const float side =
      static_cast<float>(static_cast<std::uint64_t>(n) * static_cast<std::uint64_t>(n));
  const float noDetail = 20.0f / 255.0f;
  const GaussianApproximation<float> weight(-noDetail, noDetail, 0.0f, 1.0f / side);

  // The shaping table as the mask stores it.
  const std::vector<float>& samples = colourTables().flatness.samples();
  std::vector<TL> shaped(samples.size());
  std::copy(samples.begin(), samples.end(), shaped.begin());
  const float lastSample = static_cast<float>(samples.size() - 1);

  const std::int64_t tableWidth = width + n;
  SumRows table(tableWidth, n + 1 + rowsAtOnce);
  std::vector<float> padded(checkedProduct(tableWidth, std::uint64_t(rowsAtOnce)));
  const std::vector<float> zeros(tableWidth);
  const float* above = zeros.data();

  const auto weighRow = [&](std::int64_t i, float* weights) {
    const auto source = static_cast<std::uint32_t>(reflectInto(i - r, height));
    const float* const detailed = lightness.row(source);
    const TB* const base = smoothed.row(source);
    float* const middle = weights + r;
    const GaussianApproximation<float> bell = weight;  // a copy no store can reach
    for (std::int64_t x = 0; x < width; ++x) {
      middle[x] = bell(detailed[x] - static_cast<float>(base[x]));
    }
    for (std::int64_t j = 0; j < r; ++j) weights[j] = middle[reflectInto(j - r, width)];
    for (std::int64_t j = r + width; j < tableWidth; ++j) {
      weights[j] = middle[reflectInto(j - r, width)];
    }
  };

  const auto writeMaskRow = [&](std::int64_t y) {
    const float* const top = table.row(y);
    const float* const bottom = table.row(y + n);
    TL* const out = mask.row(static_cast<std::uint32_t>(y));
    for (std::int64_t x = 0; x < width; ++x) {
      const float share = ((top[x] + bottom[x + n]) - bottom[x]) - top[x + n];
      const float place = share * lastSample;
      const float held = place > 0.0f ? place : 0.0f;  // NaN as well
      out[x] = shaped[static_cast<std::int32_t>(held < lastSample ? held : lastSample)];
    }
  };

  for (std::int64_t i = 0; i < height + n; i += rowsAtOnce) {
    // The last step may sum rows that no window needs.
    std::array<SkewedRow, rowsAtOnce> rows;
    for (std::int64_t k = 0; k < rowsAtOnce; ++k) {
      float* const weights = &padded[k * tableWidth];
      weighRow(i + k, weights);
      rows[k] = {weights, table.row(i + k), 0.0f, 0.0f};
    }
    sumRows(rows, above, tableWidth);
    above = rows.back().sums;
    for (std::int64_t k = 0; k < rowsAtOnce; ++k) {
      const std::int64_t y = i + k - n;
      if (y >= 0 && y < height) writeMaskRow(y);
    }
  }
}

template void computeFlatnessMask(const Image<float>&, const Image<float>&, int, Image<float>&);
template void computeFlatnessMask(const Image<float>&, const Image<QuantizedFloat<unsigned char>>&,
                                  int, Image<QuantizedFloat<unsigned char>>&);

}  // namespace pelorin::image_processing
