#include "image_processing/autoenhance/masks/grid_blur.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/autoenhance/masks/grid_blur_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include <cstdlib>
#include <cstring>

#include "image_processing/core/simd.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
#if HWY_TARGET == HWY_SCALAR
void blur(Grid& grid, float sigmaRange) {
  blurScalar(grid, sigmaRange);
}
#else
namespace hn = hwy::HWY_NAMESPACE;
using Floats = hn::CappedTag<float, 16>;
using F = hn::Vec<Floats>;
constexpr std::size_t lanes = hn::MaxLanes(Floats());
constexpr std::size_t cellFloats = 2 * gridBins;

/// The middle three taps of the bell in space. The outer two weigh 0 and the centre 1: what they
/// multiply and add leaves every sum as it is.
struct SpatialBell {
  F before, after;

  HWY_INLINE F operator()(F previous, F here, F next) const {
    return hn::Add(hn::Add(hn::Mul(before, previous), here), hn::Mul(after, next));
  }
};

/// Blurs the floats of `count` cells that lie `stride` floats apart.
HWY_INLINE void blurLine(const SpatialBell& bell, float* cells, std::int64_t count,
                         std::ptrdiff_t stride) {
  const Floats d;
  for (std::size_t i = 0; i < cellFloats; i += lanes) {
    float* cell = cells + i;
    F here = hn::LoadU(d, cell);
    F previous = count > 1 ? hn::LoadU(d, cell + stride) : here;
    for (std::int64_t k = 0; k < count; ++k, cell += stride) {
      const F next = k + 1 < count ? hn::LoadU(d, cell + stride) : here;
      hn::StoreU(bell(previous, here, next), d, cell);
      previous = here;
      here = next;
    }
  }
}

/// @param bell  the weight, twice, for each distance of the target bin above the source bin, from
///              -31 to 31; 0 beyond the support. In float it is not the one at the opposite
///              distance.
HWY_INLINE void blurLightness(const float* bell, float* cell) {
  const Floats d;
  const hn::Repartition<std::uint64_t, Floats> nodes;
  HWY_ALIGN std::uint64_t before[gridBins];
  std::memcpy(before, cell, sizeof before);
  // As many sums as stay in registers. Every source bin adds to all of them, the darkest first;
  // beyond the support it adds 0.
  constexpr std::size_t held = std::min<std::size_t>(cellFloats / lanes, 8);
  for (std::size_t first = 0; first < cellFloats; first += held * lanes) {
    F sums[held];
    for (F& sum : sums) sum = hn::Zero(d);
    for (std::size_t source = 0; source < gridBins; ++source) {
      if (before[source] == 0) continue;  // an empty node adds 0 as well
      const F node = hn::BitCast(d, hn::Set(nodes, before[source]));
      const float* const weights = bell + 2 * (gridBins - 1 - source) + first;
      for (std::size_t i = 0; i < held; ++i) {
        sums[i] = hn::Add(sums[i], hn::Mul(hn::LoadU(d, weights + i * lanes), node));
      }
    }
    for (std::size_t i = 0; i < held; ++i) hn::StoreU(sums[i], d, cell + first + i * lanes);
  }
}

void blur(Grid& grid, float sigmaRange) {
  const GaussianApproximation<float> spatial = spatialBell();
  const SpatialBell bell{hn::Set(Floats(), spatial(-1.0f)), hn::Set(Floats(), spatial(1.0f))};
  const auto floats = [&](std::int64_t row) { return &(*grid.row(row))[0].value; };
  const auto columns = static_cast<std::ptrdiff_t>(grid.columns);
  for (std::int64_t y = 0; y < grid.rows; ++y) blurLine(bell, floats(y), columns, cellFloats);
  for (std::ptrdiff_t x = 0; x < columns; ++x) {
    blurLine(bell, floats(0) + x * cellFloats, grid.rows, columns * cellFloats);
  }

  const std::int64_t radius = rangeRadius(sigmaRange);
  const GaussianApproximation<float> range = rangeBell(radius);
  float weights[2 * (2 * gridBins - 1)];
  for (std::int32_t distance = 1 - gridBins; distance < gridBins; ++distance) {
    float* const both = weights + 2 * (distance + gridBins - 1);
    both[0] = both[1] = std::abs(distance) <= radius ? range(static_cast<float>(distance)) : 0.0f;
  }
  for (GridCell& cell : grid.cells) blurLightness(weights, &cell[0].value);
}
#endif

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
namespace pelorin::image_processing {
HWY_EXPORT(blur);
void blur(Grid& grid, float sigmaRange) {
  HWY_DYNAMIC_DISPATCH(blur)(grid, sigmaRange);
}
}  // namespace pelorin::image_processing
#endif
