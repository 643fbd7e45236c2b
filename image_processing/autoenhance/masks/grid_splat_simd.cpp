#include "image_processing/autoenhance/masks/grid_splat.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/autoenhance/masks/grid_splat_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include <cstring>

#include "image_processing/core/simd.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
namespace hn = hwy::HWY_NAMESPACE;
using Floats = hn::CappedTag<float, 16>;
using Ints = hn::RebindToSigned<Floats>;
using Words = hn::RebindToUnsigned<Floats>;
constexpr std::size_t lanes = hn::MaxLanes(Floats());

void findNodes(const float* lightness, const std::uint32_t* firstNodes, std::uint32_t* nodes,
               std::size_t count) {
  const auto scale = hn::Set(Floats(), lastGridBin);
  std::size_t i = 0;
  for (; i + lanes <= count; i += lanes) {
    const auto place =
        hn::Add(hn::Mul(hn::LoadU(Floats(), lightness + i), scale), hn::Set(Floats(), 0.5f));
    // NaN is in bin 0.
    const auto positive = hn::IfThenElseZero(hn::Gt(place, hn::Zero(Floats())), place);
    const auto bin = simd::truncate(hn::Min(positive, scale));
    hn::StoreU(hn::Add(hn::LoadU(Words(), firstNodes + i), hn::BitCast(Words(), bin)), Words(),
               nodes + i);
  }
  for (; i < count; ++i) {
    const float bin = std::clamp(lightness[i] * lastGridBin + 0.5f, 0.0f, lastGridBin);
    nodes[i] = firstNodes[i] + truncateTo<std::int32_t>(bin);
  }
}

/// One addition for value and weight together.
HWY_INLINE void addTo(GridNode& node, float value) {
  typedef float Pair __attribute__((vector_size(8)));
  Pair sums;
  std::memcpy(&sums, &node, sizeof sums);
  sums += Pair{value, 1.0f};
  node = {sums[0], sums[1]};
}

using Starts = std::array<std::uint32_t, GridSplatter::strips + 1>;

void addStrips(const float* lightness, const std::uint32_t* nodes, const Starts& starts,
               GridNode* row) {
  const auto add = [&](std::size_t x) HWY_ATTR { addTo(row[nodes[x]], lightness[x]); };
  std::size_t shared = starts[1] - starts[0];
  for (std::size_t s = 1; s < GridSplatter::strips; ++s) {
    shared = std::min<std::size_t>(shared, starts[s + 1] - starts[s]);
  }
  static_assert(GridSplatter::strips == 8);
  const std::size_t b = starts[1], c = starts[2], d = starts[3], e = starts[4], f = starts[5],
                    g = starts[6], h = starts[7];
  for (std::size_t i = 0; i < shared; ++i) {
    add(i);
    add(b + i);
    add(c + i);
    add(d + i);
    add(e + i);
    add(f + i);
    add(g + i);
    add(h + i);
  }
  for (std::size_t s = 0; s < GridSplatter::strips; ++s) {
    for (std::size_t x = starts[s] + shared; x < starts[s + 1]; ++x) add(x);
  }
}

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
namespace pelorin::image_processing {

HWY_EXPORT(findNodes);
HWY_EXPORT(addStrips);

GridSplatter::GridSplatter(Grid& grid, std::uint32_t width, float cellSize)
    : grid_(grid), cellSize_(cellSize), firstNodes_(width), nodes_(width) {
  for (std::uint32_t x = 0; x < width; ++x) {
    firstNodes_[x] = static_cast<std::uint32_t>(nearestNode(x, cellSize, grid.columns) * gridBins);
  }
  starts_.front() = 0;
  for (std::size_t s = 1; s < strips; ++s) {
    auto x = static_cast<std::uint32_t>(std::uint64_t{width} * s / strips);
    while (x > starts_[s - 1] && firstNodes_[x] == firstNodes_[x - 1]) --x;
    starts_[s] = x;
  }
  starts_.back() = width;
}

void GridSplatter::addRow(std::uint32_t y, const float* lightness) {
  HWY_DYNAMIC_DISPATCH(findNodes)
  (lightness, firstNodes_.data(), nodes_.data(), nodes_.size());
  GridNode* const row = grid_.row(nearestNode(y, cellSize_, grid_.rows))->data();
  HWY_DYNAMIC_DISPATCH(addStrips)(lightness, nodes_.data(), starts_, row);
}

void splat(const Image<float>& lightness, float cellSize, Grid& grid) {
  GridSplatter splatter(grid, lightness.width, cellSize);
  for (std::uint32_t y = 0; y < lightness.height; ++y) splatter.addRow(y, lightness.row(y));
}

}  // namespace pelorin::image_processing
#endif
