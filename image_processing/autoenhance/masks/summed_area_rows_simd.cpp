#include "image_processing/autoenhance/masks/summed_area_rows.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/autoenhance/masks/summed_area_rows_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include "image_processing/core/simd.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
#if HWY_TARGET == HWY_SCALAR
void sumRows(const float* above, float* rows, std::ptrdiff_t stride, std::int64_t width) {
  sumRowsScalar(above, rows, stride, width);
}
#else
namespace hn = hwy::HWY_NAMESPACE;
using Floats = hn::CappedTag<float, sumRowsAtOnce>;
using F = hn::Vec<Floats>;
constexpr std::size_t lanes = hn::MaxLanes(Floats());
constexpr std::size_t vectors = sumRowsAtOnce / lanes;

// Every sum waits for the one to its left, so a lane is a row: all rows advance together, each two
// columns behind the row above it. The sum above is then what the neighbouring lane found two steps
// ago, and it is there in time.
constexpr std::ptrdiff_t columnsBehind = 2;

/// The columns before which row `k` is formed by plain code.
constexpr std::ptrdiff_t firstColumn(std::ptrdiff_t k) {
  return columnsBehind * (sumRowsAtOnce - k);
}

/// What the lanes carry from step to step: lane k of vector v is row v · lanes + k.
struct Wavefront {
  HWY_ATTR Wavefront() {}  // an implicit one is not compiled for the instruction set

  F left[vectors];        // the sums of the last step
  F beforeLeft[vectors];  // and of the one before it
  F aboveLeft[vectors];
};

HWY_INLINE Wavefront startWavefront(const float* above, float* rows, std::ptrdiff_t stride) {
  for (std::ptrdiff_t k = 0; k < sumRowsAtOnce; ++k) {
    float* const row = rows + k * stride;
    const float* const up = k == 0 ? above : row - stride;
    row[0] = ((row[0] + up[0]) + 0.0f) - up[1];
    for (std::ptrdiff_t j = 1; j < firstColumn(k); ++j) {
      row[j] = ((row[j] + up[j]) + row[j - 1]) - up[j - 1];
    }
  }
  HWY_ALIGN float left[sumRowsAtOnce], beforeLeft[sumRowsAtOnce], aboveLeft[sumRowsAtOnce];
  for (std::ptrdiff_t k = 0; k < sumRowsAtOnce; ++k) {
    const float* const row = rows + k * stride;
    const float* const up = k == 0 ? above : row - stride;
    left[k] = row[firstColumn(k) - 1];
    beforeLeft[k] = row[firstColumn(k) - 2];
    aboveLeft[k] = up[firstColumn(k) - 1];
  }
  Wavefront front;
  for (std::size_t v = 0; v < vectors; ++v) {
    front.left[v] = hn::Load(Floats(), left + v * lanes);
    front.beforeLeft[v] = hn::Load(Floats(), beforeLeft + v * lanes);
    front.aboveLeft[v] = hn::Load(Floats(), aboveLeft + v * lanes);
  }
  return front;
}

void sumRows(const float* above, float* rows, std::ptrdiff_t stride, std::int64_t width) {
  const Floats d;
  Wavefront front = startWavefront(above, rows, stride);
  HWY_ALIGN std::int32_t previousLanes[lanes];
  for (std::size_t k = 0; k < lanes; ++k) previousLanes[k] = (k + lanes - 1) % lanes;
  const auto rotation = hn::SetTableIndices(d, previousLanes);
  const auto firstLane = hn::FirstN(d, 1);

  // Four columns at a time, until the last row has reached the width.
  const std::ptrdiff_t end = width + columnsBehind * (sumRowsAtOnce - 1);
  for (std::ptrdiff_t column = firstColumn(0); column < end; column += 4) {
    F sums[vectors][4];
    const auto group = [&](std::size_t v, std::size_t i) HWY_ATTR {
      return [=](std::size_t g) HWY_ATTR {
        const std::ptrdiff_t k = v * lanes + 4 * g + i;
        return rows + column + k * (stride - columnsBehind);
      };
    };
    for (std::size_t v = 0; v < vectors; ++v) {
      for (std::size_t i = 0; i < 4; ++i) sums[v][i] = simd::loadFours(d, group(v, i));
      simd::transposeFours(d, sums[v]);
    }
    for (std::size_t step = 0; step < 4; ++step) {
      F previous = hn::Set(d, above[column + step]);
      for (std::size_t v = 0; v < vectors; ++v) {
        const F rotated = hn::TableLookupLanes(front.beforeLeft[v], rotation);
        const F up = hn::IfThenElse(firstLane, previous, rotated);
        previous = rotated;
        const F sum =
            hn::Sub(hn::Add(hn::Add(sums[v][step], up), front.left[v]), front.aboveLeft[v]);
        front.aboveLeft[v] = up;
        front.beforeLeft[v] = front.left[v];
        front.left[v] = sum;
        sums[v][step] = sum;
      }
    }
    for (std::size_t v = 0; v < vectors; ++v) {
      simd::transposeFours(d, sums[v]);
      for (std::size_t i = 0; i < 4; ++i) simd::storeFours(d, sums[v][i], group(v, i));
    }
  }
}
#endif

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
namespace pelorin::image_processing {
HWY_EXPORT(sumRows);
void sumRows(const float* above, float* rows, std::ptrdiff_t stride, std::int64_t width) {
  HWY_DYNAMIC_DISPATCH(sumRows)(above, rows, stride, width);
}
}  // namespace pelorin::image_processing
#endif
