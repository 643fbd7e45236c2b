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
void blur(Grid& grid, float sigmaRange, Workers*) {
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

HWY_INLINE SpatialBell spatialWeights() {
  const GaussianApproximation<float> bell = spatialBell();
  return {hn::Set(Floats(), bell(-1.0f)), hn::Set(Floats(), bell(1.0f))};
}

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

/// Blurs cells, rows or columns of the grid, from `first` to before `end`.
void blurRows(Grid& grid, std::int64_t first, std::int64_t end) {
  const SpatialBell bell = spatialWeights();
  for (std::int64_t y = first; y < end; ++y) {
    blurLine(bell, &(*grid.row(y))[0].value, grid.columns, cellFloats);
  }
}

void blurColumns(Grid& grid, std::int64_t first, std::int64_t end) {
  const SpatialBell bell = spatialWeights();
  const auto stride = static_cast<std::ptrdiff_t>(grid.columns * cellFloats);
  for (std::int64_t x = first; x < end; ++x) {
    blurLine(bell, &grid.row(0)[x][0].value, grid.rows, stride);
  }
}

void blurCells(const float* bell, Grid& grid, std::int64_t first, std::int64_t end) {
  for (std::int64_t i = first; i < end; ++i) blurLightness(bell, &grid.cells[i][0].value);
}

void blur(Grid& grid, float sigmaRange, Workers* workers) {
  const std::size_t parts = tasksFor(workers);
  const auto share = [&](std::int64_t count, const auto& blurSome) {
    runTasks(workers, parts, [&](std::size_t i) {
      const auto total = static_cast<std::uint64_t>(count);
      blurSome(static_cast<std::int64_t>(partStart(total, i, parts)),
               static_cast<std::int64_t>(partStart(total, i + 1, parts)));
    });
  };
  share(grid.rows, [&](std::int64_t first, std::int64_t end) { blurRows(grid, first, end); });
  share(grid.columns, [&](std::int64_t first, std::int64_t end) { blurColumns(grid, first, end); });

  const std::int64_t radius = rangeRadius(sigmaRange);
  const GaussianApproximation<float> range = rangeBell(radius);
  float weights[2 * (2 * gridBins - 1)];
  for (std::int32_t distance = 1 - gridBins; distance < gridBins; ++distance) {
    float* const both = weights + 2 * (distance + gridBins - 1);
    both[0] = both[1] = std::abs(distance) <= radius ? range(static_cast<float>(distance)) : 0.0f;
  }
  share(static_cast<std::int64_t>(grid.cells.size()),
        [&](std::int64_t first, std::int64_t end) { blurCells(weights, grid, first, end); });
}
#endif

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
namespace pelorin::image_processing {
HWY_EXPORT(blur);
void blur(Grid& grid, float sigmaRange, Workers* workers) {
  HWY_DYNAMIC_DISPATCH(blur)(grid, sigmaRange, workers);
}
}  // namespace pelorin::image_processing
#endif
