#include <algorithm>

#include "image_processing/quality/aligned_floats.h"
#include "image_processing/quality/block_features.h"
#include "image_processing/quality/ggd.h"
#include "image_processing/quality/write_features.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/quality/block_features_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include "image_processing/core/simd.h"

// Each lane sums a block of its own, so that every sum keeps the order of its rows. A row of all
// blocks of a group is first turned so that one vector holds one column of every block.
HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
#if HWY_TARGET == HWY_SCALAR
void computeBlockFeatures(const Image<float>& structure, std::uint32_t featuresPerScale,
                          std::uint32_t blockSize, std::uint32_t blockColumns,
                          std::uint32_t blockRows, std::uint32_t scale, Image<float>& features) {
  computeBlockFeaturesScalar(structure, featuresPerScale, blockSize, blockColumns, blockRows, scale,
                             features);
}
#else
namespace hn = hwy::HWY_NAMESPACE;

constexpr std::size_t mostLanes = 16;
using Floats = hn::CappedTag<float, mostLanes>;
using Vector = hn::Vec<Floats>;
using Counts = hn::RebindToUnsigned<Floats>;
using CountVector = hn::Vec<Counts>;

// The sums of a group's blocks for one shift, a lane a block.
struct GroupSums {
  HWY_ALIGN float absolute[mostLanes] = {}, squares[mostLanes] = {};
  HWY_ALIGN float leftSquares[mostLanes] = {}, rightSquares[mostLanes] = {};
  HWY_ALIGN std::uint32_t left[mostLanes] = {}, right[mostLanes] = {};
};

// Adds `width` values of each block; `valueAt` gives those of one column.
template <typename ValueAt>
HWY_INLINE void addRow(std::size_t width, GroupSums& sums, const ValueAt& valueAt) {
  const Floats floats;
  const Counts counts;
  const Vector zero = hn::Zero(floats);
  const CountVector one = hn::Set(counts, 1);
  Vector absolute = hn::Load(floats, sums.absolute), squares = hn::Load(floats, sums.squares);
  Vector leftSquares = hn::Load(floats, sums.leftSquares);
  Vector rightSquares = hn::Load(floats, sums.rightSquares);
  CountVector left = hn::Load(counts, sums.left), right = hn::Load(counts, sums.right);
  for (std::size_t i = 0; i < width; ++i) {
    const Vector value = valueAt(i);
    const Vector square = hn::Mul(value, value);
    const auto isLeft = hn::Lt(value, zero), isRight = hn::Lt(zero, value);
    absolute = hn::Add(absolute, hn::Abs(value));
    squares = hn::Add(squares, square);
    // No sum is ever -0, so adding 0 changes nothing.
    leftSquares = hn::Add(leftSquares, hn::IfThenElseZero(isLeft, square));
    rightSquares = hn::Add(rightSquares, hn::IfThenElseZero(isRight, square));
    left = hn::Add(left, hn::IfThenElseZero(hn::RebindMask(counts, isLeft), one));
    right = hn::Add(right, hn::IfThenElseZero(hn::RebindMask(counts, isRight), one));
  }
  hn::Store(absolute, floats, sums.absolute);
  hn::Store(squares, floats, sums.squares);
  hn::Store(leftSquares, floats, sums.leftSquares);
  hn::Store(rightSquares, floats, sums.rightSquares);
  hn::Store(left, counts, sums.left);
  hn::Store(right, counts, sums.right);
}

// One row of every block of a group, a vector a column, with the columns wrapped round at each end:
// column i of lane l is at [(i + 1) * lanes + l], i from -1 to the width.
void turnRow(const float* const* blocks, std::size_t offset, std::size_t width, float* turned) {
  const hn::CappedTag<float, 4> four;  // every target but the scalar one has these
  const std::size_t lanes = hn::Lanes(Floats());
  float* columns = turned + lanes;
  for (std::size_t lane = 0; lane < lanes; lane += 4) {
    const float* a = blocks[lane] + offset;
    const float* b = blocks[lane + 1] + offset;
    const float* c = blocks[lane + 2] + offset;
    const float* d = blocks[lane + 3] + offset;
    float* column = columns + lane;
    std::size_t i = 0;
    for (; i + 4 <= width; i += 4, column += 4 * lanes) {
      hn::Vec<decltype(four)> square[] = {hn::LoadU(four, a + i), hn::LoadU(four, b + i),
                                          hn::LoadU(four, c + i), hn::LoadU(four, d + i)};
      simd::transposeFours(four, square);
      for (std::size_t j = 0; j < 4; ++j) hn::Store(square[j], four, column + j * lanes);
    }
    for (; i < width; ++i, column += lanes) {
      column[0] = a[i];
      column[1] = b[i];
      column[2] = c[i];
      column[3] = d[i];
    }
  }
  std::copy_n(columns + (width - 1) * lanes, lanes, turned);
  std::copy_n(columns, lanes, columns + width * lanes);
}

void computeBlockFeatures(const Image<float>& structure, std::uint32_t featuresPerScale,
                          std::uint32_t blockSize, std::uint32_t blockColumns,
                          std::uint32_t blockRows, std::uint32_t scale, Image<float>& features) {
  const Floats floats;
  const std::size_t lanes = hn::Lanes(floats);
  const std::size_t side = blockSize / (scale + 1);
  const std::size_t blockCount = std::size_t{blockColumns} * blockRows;
  if (side == 0 || std::uint64_t{blockColumns} * side > structure.width ||
      std::uint64_t{blockRows} * side > structure.height)
    return computeBlockFeaturesScalar(structure, featuresPerScale, blockSize, blockColumns,
                                      blockRows, scale, features);

  const std::size_t turnedSize = (side + 2) * lanes;
  AlignedFloats turned(2 * turnedSize);
  for (std::size_t first = 0; first < blockCount; first += lanes) {
    const float* blocks[mostLanes];
    for (std::size_t lane = 0; lane < lanes; ++lane) {
      const std::size_t k = std::min(first + lane, blockCount - 1);  // spare lanes repeat the last
      blocks[lane] = structure.data.get() + k / blockColumns * side * structure.width +
                     k % blockColumns * side;
    }
    std::array<GroupSums, niqeShifts.size()> sums;
    float* above = turned.data();
    float* row = above + turnedSize;
    turnRow(blocks, (side - 1) * structure.width, side, above);
    for (std::size_t j = 0; j < side; ++j) {
      turnRow(blocks, j * structure.width, side, row);
      const auto at = [&](const float* turnedRow, std::size_t i, int dx) {
        return hn::Load(floats, turnedRow + (i + 1 - dx) * lanes);
      };
      addRow(side, sums[0], [&](std::size_t i) { return at(row, i, 0); });
      addRow(side, sums[1], [&](std::size_t i) { return hn::Mul(at(row, i, 0), at(row, i, 1)); });
      for (std::size_t shift = 2; shift < niqeShifts.size(); ++shift)
        addRow(side, sums[shift], [&, dx = niqeShifts[shift].dx](std::size_t i) {
          return hn::Mul(at(row, i, 0), at(above, i, dx));
        });
      std::swap(above, row);
    }
    for (std::size_t lane = 0; lane < std::min(lanes, blockCount - first); ++lane) {
      std::array<Ggd, niqeShifts.size()> fits;
      for (std::size_t i = 0; i < fits.size(); ++i) {
        const GroupSums& s = sums[i];
        fits[i] = fitGgd({s.absolute[lane], s.squares[lane], s.leftSquares[lane],
                          s.rightSquares[lane], s.left[lane], s.right[lane]},
                         static_cast<float>(side * side));
      }
      writeFeatures(fits, featuresPerScale * scale, static_cast<std::uint32_t>(first + lane),
                    features);
    }
  }
}
#endif
}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();
#if HWY_ONCE
namespace pelorin::image_processing {
HWY_EXPORT(computeBlockFeatures);
void computeBlockFeatures(const Image<float>& structure, std::uint32_t featuresPerScale,
                          std::uint32_t blockSize, std::uint32_t blockColumns,
                          std::uint32_t blockRows, std::uint32_t scale, Image<float>& features) {
  requireRoomForFeatures(features, featuresPerScale, blockColumns, blockRows, scale);
  HWY_DYNAMIC_DISPATCH(computeBlockFeatures)
  (structure, featuresPerScale, blockSize, blockColumns, blockRows, scale, features);
}
}  // namespace pelorin::image_processing
#endif
