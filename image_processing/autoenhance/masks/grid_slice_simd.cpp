#include "image_processing/autoenhance/masks/grid_slice.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/autoenhance/masks/grid_slice_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include <tuple>

#include "image_processing/core/simd.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
namespace hn = hwy::HWY_NAMESPACE;
using Floats = hn::CappedTag<float, GridSlicer::padding>;
using Ints = hn::RebindToSigned<Floats>;
using F = hn::Vec<Floats>;
constexpr std::size_t lanes = hn::MaxLanes(Floats());

HWY_INLINE F set(float value) {
  return hn::Set(Floats(), value);
}

/// `lerp` in vectors.
HWY_INLINE F mix(F t, F a, F b) {
  return hn::Add(hn::Mul(hn::Sub(set(1.0f), t), a), hn::Mul(t, b));
}

/// Pixels of one block between reading their lightness and writing their smoothing.
struct Block {
  HWY_ALIGN std::int32_t bins[GridSlicer::blockSize + GridSlicer::padding];
  HWY_ALIGN float fractions[GridSlicer::blockSize + GridSlicer::padding];
  HWY_ALIGN float values[GridSlicer::blockSize + GridSlicer::padding];
  HWY_ALIGN float weights[GridSlicer::blockSize + GridSlicer::padding];
};

/// What two neighbouring bins of a column hold for each of some pixels.
struct Corners {
  F value[2], weight[2];
};

#if HWY_TARGET <= HWY_AVX3
/// A column in registers, read by permutes: values, then weights.
class Column {
 public:
  explicit Column(const float* column)
      : values_{hn::LoadU(Floats(), column), hn::LoadU(Floats(), column + 16)},
        weights_{hn::LoadU(Floats(), column + 32), hn::LoadU(Floats(), column + 48)} {}

  HWY_INLINE Corners at(const std::int32_t* bins) const {
    const auto lower = hn::LoadU(Ints(), bins);
    const auto upper = hn::Min(hn::Add(lower, hn::Set(Ints(), 1)), hn::Set(Ints(), gridBins - 1));
    return {{read(values_, lower), read(values_, upper)},
            {read(weights_, lower), read(weights_, upper)}};
  }

  static HWY_INLINE void interpolate(F t, const float* upper, const float* lower, float* column) {
    const Floats d;
    for (std::size_t half = 0; half < 2; ++half) {
      const auto nodes = [&](std::size_t i) HWY_ATTR {
        const std::size_t at = half * 32 + i * 16;
        return mix(t, hn::LoadU(d, upper + at), hn::LoadU(d, lower + at));
      };
      const F first = nodes(0), second = nodes(1);
      hn::StoreU(hn::ConcatEven(d, second, first), d, column + half * 16);
      hn::StoreU(hn::ConcatOdd(d, second, first), d, column + 32 + half * 16);
    }
  }

 private:
  static HWY_INLINE F read(const F* table, hn::Vec<Ints> bins) {
    return F{_mm512_permutex2var_ps(table[0].raw, bins.raw, table[1].raw)};
  }

  F values_[2], weights_[2];
};
#else
/// A column in memory, its nodes as they stand in the grid, with a copy of the last one behind it:
/// the neighbour of the lightest bin is that bin.
class Column {
 public:
  explicit Column(const float* column) : nodes_(column) {}

  HWY_INLINE Corners at(const std::int32_t* bins) const {
    // Value and weight of two neighbouring bins are four floats in a row.
    F fours[4];
#if HWY_TARGET == HWY_SCALAR
    for (std::size_t i = 0; i < 4; ++i) fours[i] = set(nodes_[2 * bins[0] + i]);
#else
    for (std::size_t i = 0; i < 4; ++i) {
      fours[i] = simd::loadFours(
          Floats(), [&](std::size_t g) HWY_ATTR { return nodes_ + 2 * bins[4 * g + i]; });
    }
    simd::transposeFours(Floats(), fours);
#endif
    return {{fours[0], fours[2]}, {fours[1], fours[3]}};
  }

  static HWY_INLINE void interpolate(F t, const float* upper, const float* lower, float* column) {
    const Floats d;
    for (std::size_t i = 0; i < 2 * gridBins; i += lanes) {
      hn::StoreU(mix(t, hn::LoadU(d, upper + i), hn::LoadU(d, lower + i)), d, column + i);
    }
    column[2 * gridBins] = column[2 * gridBins - 2];
    column[2 * gridBins + 1] = column[2 * gridBins - 1];
  }

 private:
  const float* nodes_;
};
#endif

void findBins(const float* lightness, Block& block, std::size_t count) {
  std::size_t i = 0;
  for (; i + lanes <= count; i += lanes) {
    const F place = hn::Mul(hn::LoadU(Floats(), lightness + i), set(lastGridBin));
    // NaN is in bin 0.
    const F held = hn::Min(hn::IfThenElseZero(hn::Gt(place, set(0.0f)), place), set(lastGridBin));
    const auto bin = simd::truncate(held);
    hn::Store(bin, Ints(), block.bins + i);
    hn::Store(hn::Sub(place, hn::ConvertTo(Floats(), bin)), Floats(), block.fractions + i);
  }
  for (; i < count; ++i) {
    const float place = lightness[i] * lastGridBin;
    block.bins[i] = std::clamp(truncateTo<std::int32_t>(place), 0, gridBins - 1);
    block.fractions[i] = place - static_cast<float>(block.bins[i]);
  }
}

/// Reads `count` pixels between two columns, and up to a vector beyond.
HWY_INLINE void interpolate(const Column& before, const Column& after, const float* fractions,
                            Block& block, std::size_t first, std::size_t count) {
  for (std::size_t i = 0; i < count; i += lanes) {
    const std::size_t at = first + i;
    const Corners left = before.at(block.bins + at);
    const Corners right = after.at(block.bins + at);
    const F tx = hn::LoadU(Floats(), fractions + i);
    const F tb = hn::LoadU(Floats(), block.fractions + at);
    hn::StoreU(
        mix(tb, mix(tx, left.value[0], right.value[0]), mix(tx, left.value[1], right.value[1])),
        Floats(), block.values + at);
    hn::StoreU(
        mix(tb, mix(tx, left.weight[0], right.weight[0]), mix(tx, left.weight[1], right.weight[1])),
        Floats(), block.weights + at);
  }
}

HWY_INLINE void store(F smoothed, float* out) {
  hn::StoreU(smoothed, Floats(), out);
}

HWY_INLINE void store(F smoothed, QuantizedFloat<unsigned char>* out) {
  // As the assignment of a quantised pixel: the low byte of the truncated and saturated number.
  const F scaled = hn::Mul(smoothed, set(QuantizedFloat<unsigned char>::codesPerUnit));
  const F beyond = hn::IfThenElseZero(hn::Ge(scaled, set(4294967296.0f)), set(255.0f));
  const F held = hn::IfThenElse(hn::Lt(scaled, set(2147483648.0f)), scaled, beyond);
  const auto number = simd::truncate(hn::IfThenElseZero(hn::Gt(held, set(0.0f)), held));
  const hn::Rebind<std::uint8_t, Floats> bytes;
  hn::StoreU(hn::DemoteTo(bytes, hn::And(number, hn::Set(Ints(), 255))), bytes,
             reinterpret_cast<std::uint8_t*>(out));
}

template <typename T>
HWY_INLINE void divide(const Block& block, T* smoothed, std::size_t count) {
  std::size_t i = 0;
  for (; i + lanes <= count; i += lanes) {
    const F value = hn::Load(Floats(), block.values + i);
    const F weight = hn::Load(Floats(), block.weights + i);
    store(hn::IfThenElse(hn::Gt(weight, set(0.0f)), simd::divide(value, weight), value),
          smoothed + i);
  }
  for (; i < count; ++i) {
    const float value = block.values[i], weight = block.weights[i];
    smoothed[i] = weight > 0.0f ? value / weight : value;
  }
}

template <typename T>
void sliceRuns(const std::vector<SliceRun>& runs, const float* fractions,
               const SliceColumn* columns, const float* lightness, T* smoothed,
               std::uint32_t width) {
  Block block;
  std::fill(std::begin(block.bins), std::end(block.bins), 0);
  auto run = runs.begin();
  for (std::uint32_t start = 0; start < width; start += GridSlicer::blockSize) {
    const std::uint32_t size = std::min(GridSlicer::blockSize, width - start);
    findBins(lightness + start, block, size);
    for (; run != runs.end() && run->first < start + size; ++run) {
      interpolate(Column(columns[run->before].nodes), Column(columns[run->after].nodes),
                  fractions + run->first, block, run->first - start, run->end - run->first);
    }
    divide(block, smoothed + start, size);
  }
}

void interpolateColumns(const Grid& grid, const GridNeighbours& rows, SliceColumn* columns) {
  const F t = set(rows.fraction);
  for (std::int64_t x = 0; x < grid.columns; ++x) {
    Column::interpolate(t, &grid.row(rows.before)[x][0].value, &grid.row(rows.after)[x][0].value,
                        columns[x].nodes);
  }
}

/// Every kernel of this file, for every kind of mask. The types are those of every instruction set.
using Entries = std::tuple<decltype(&interpolateColumns), decltype(&sliceRuns<float>),
                           decltype(&sliceRuns<QuantizedFloat<unsigned char>>)>;
Entries entries() {
  return {interpolateColumns, sliceRuns<float>, sliceRuns<QuantizedFloat<unsigned char>>};
}

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
namespace pelorin::image_processing {

using Quantized = QuantizedFloat<unsigned char>;
HWY_EXPORT(entries);

GridSlicer::GridSlicer(const Grid& grid, std::uint32_t width, float cellSize)
    : grid_(grid),
      width_(width),
      cellSize_(cellSize),
      fractions_(std::size_t{width} + padding),
      columns_(grid.columns) {
  for (std::uint32_t x = 0; x < width; ++x) {
    const GridNeighbours at(x, cellSize, grid.columns);
    fractions_[x] = at.fraction;
    if (x % blockSize == 0 || at.before != runs_.back().before) {
      runs_.push_back({x, x, at.before, at.after});
    }
    runs_.back().end = x + 1;
  }
}

template <typename T>
void GridSlicer::sliceRow(std::uint32_t y, const float* lightness, T* smoothed) {
  const auto kernels = HWY_DYNAMIC_DISPATCH(entries)();
  std::get<decltype(&HWY_NAMESPACE::interpolateColumns)>(kernels)(grid_, {y, cellSize_, grid_.rows},
                                                                  columns_.data());
  std::get<decltype(&HWY_NAMESPACE::sliceRuns<T>)>(kernels)(
      runs_, fractions_.data(), columns_.data(), lightness, smoothed, width_);
}

template void GridSlicer::sliceRow(std::uint32_t, const float*, float*);
template void GridSlicer::sliceRow(std::uint32_t, const float*, Quantized*);

template <typename T>
void slice(const Grid& grid, const Image<float>& lightness, float cellSize, Image<T>& smoothed) {
  GridSlicer slicer(grid, lightness.width, cellSize);
  for (std::uint32_t y = 0; y < lightness.height; ++y) {
    slicer.sliceRow(y, lightness.row(y), smoothed.row(y));
  }
}

template void slice(const Grid&, const Image<float>&, float, Image<float>&);
template void slice(const Grid&, const Image<float>&, float, Image<Quantized>&);

}  // namespace pelorin::image_processing
#endif
