#include "image_processing/features/fast_corner.h"
#include "image_processing/features/fast_rows.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/features/fast_rows_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include <algorithm>
#include <bit>

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
namespace hn = hwy::HWY_NAMESPACE;
using Bytes = hn::ScalableTag<std::uint8_t>;
using ByteVector = hn::Vec<Bytes>;

// The circles around a vector of neighbouring pixels. Vectors are read where they are used, since
// there are no arrays of vectors on every instruction set; the compiler merges equal terms.
struct Circles {
  const std::uint8_t* centre;
  std::ptrdiff_t stride;

  HWY_INLINE ByteVector middle() const { return hn::LoadU(Bytes(), centre); }

  template <int i>
  HWY_INLINE ByteVector pixel() const {
    constexpr xy step = fastCircle[i % 16];
    return hn::LoadU(Bytes(), centre + step.y * stride + step.x);
  }

  // Of `pairs` pairs of opposite pixels, `step` apart from the pixel `first` on: the least of the
  // brighter ones, and the greatest of the darker ones.
  template <int pairs, int step, int first = 0>
  HWY_INLINE ByteVector leastOfBrighter() const {
    if constexpr (pairs == 1) {
      return hn::Max(pixel<first>(), pixel<first + 8>());
    } else {
      return hn::Min(leastOfBrighter<pairs / 2, step, first>(),
                     leastOfBrighter<pairs / 2, step, first + pairs / 2 * step>());
    }
  }
  template <int pairs, int step, int first = 0>
  HWY_INLINE ByteVector greatestOfDarker() const {
    if constexpr (pairs == 1) {
      return hn::Min(pixel<first>(), pixel<first + 8>());
    } else {
      return hn::Max(greatestOfDarker<pairs / 2, step, first>(),
                     greatestOfDarker<pairs / 2, step, first + pairs / 2 * step>());
    }
  }
};

// Circles of which some are seen as negatives, those where `negative` is 255 and not 0.
struct BrightCircles {
  Circles circles;
  ByteVector negative;

  HWY_INLINE ByteVector middle() const { return hn::Xor(circles.middle(), negative); }

  template <int i>
  HWY_INLINE ByteVector pixel() const {
    return hn::Xor(circles.pixel<i>(), negative);
  }

  // Of `count` pixels of the circle from `first` on. Halves of equal length make all arcs of a
  // circle share their parts.
  template <int first, int count>
  HWY_INLINE ByteVector least() const {
    if constexpr (count == 1) {
      return pixel<first>();
    } else {
      constexpr int half = std::bit_ceil(static_cast<unsigned>(count)) / 2;
      return hn::Min(least<first % 16, half>(), least<(first + half) % 16, count - half>());
    }
  }

  // The largest, over the arcs that start at `first` - 1, at `first` and so on, of the least value
  // on an arc. The two arcs of a pair have all but one pixel in common.
  template <int arc, int first = 0, int pairs = 8>
  HWY_INLINE ByteVector brightestArc() const {
    if constexpr (pairs == 1) {
      const ByteVector either = hn::Max(pixel<first + 15>(), pixel<first + arc - 1>());
      return hn::Min(least<first, arc - 1>(), either);
    } else {
      return hn::Max(brightestArc<arc, first, pairs / 2>(),
                     brightestArc<arc, first + pairs, pairs / 2>());
    }
  }
};

HWY_INLINE bool allZero(ByteVector bytes) {
  return hn::AllTrue(Bytes(), hn::Eq(bytes, hn::Zero(Bytes())));
}

// False where no pixel is a corner, as `pairs` pairs of opposite pixels tell: every arc of nine or
// more holds a pixel of each.
template <int pairs>
HWY_INLINE bool mayHoldCorners(const Circles circles, ByteVector threshold) {
  const ByteVector high = hn::SaturatedAdd(circles.middle(), threshold);
  const ByteVector low = hn::SaturatedSub(circles.middle(), threshold);
  const ByteVector bright = circles.leastOfBrighter<pairs, 8 / pairs>();
  const ByteVector dark = circles.greatestOfDarker<pairs, 8 / pairs>();
  return !allZero(hn::Or(hn::SaturatedSub(bright, high), hn::SaturatedSub(low, dark)));
}

template <int arc>
HWY_INLINE ByteVector scores(const Circles circles, ByteVector threshold) {
  // Where each of the eight pairs has a bright pixel, too few are left for a dark arc; elsewhere no
  // arc is bright. There the negative is looked at, so that arcs of one kind remain.
  const ByteVector high = hn::SaturatedAdd(circles.middle(), threshold);
  const ByteVector bright =
      hn::Min(circles.leastOfBrighter<4, 2, 0>(), circles.leastOfBrighter<4, 2, 1>());
  const auto notBright = hn::Eq(hn::SaturatedSub(bright, high), hn::Zero(Bytes()));
  const BrightCircles positives = {circles, hn::VecFromMask(Bytes(), notBright)};
  const ByteVector difference = hn::SaturatedSub(positives.brightestArc<arc>(), positives.middle());
  return hn::IfThenElseZero(hn::Gt(difference, threshold), difference);
}

// Columns of vectors that something is left to do for. Where corners are is too irregular for a
// branch to be predicted, so each is kept or not without one.
class Columns {
 public:
  HWY_INLINE void keepIf(bool wanted, std::size_t column) {
    columns_[count_] = column;
    count_ += wanted;
  }
  const std::size_t* begin() const { return columns_; }
  const std::size_t* end() const { return columns_ + count_; }

  static constexpr std::size_t room = 64;

 private:
  std::size_t columns_[room];
  std::size_t count_ = 0;
};

template <int arc>
bool scoreRow(const std::uint8_t* row, std::ptrdiff_t stride, std::size_t begin, std::size_t end,
              int threshold, std::uint8_t* map) {
  const std::size_t lanes = hn::Lanes(Bytes());
  if (end - begin < lanes) {
    return fastScoreRowScalar(row, stride, begin, end, arc, threshold, map);
  }
  const ByteVector thresholds = hn::Set(Bytes(), static_cast<std::uint8_t>(threshold));
  ByteVector any = hn::Zero(Bytes());
  for (std::size_t x = begin; x < end;) {
    Columns possible;
    for (std::size_t tested = 0; tested < Columns::room && x < end; ++tested, x += lanes) {
      const std::size_t column = std::min(x, end - lanes);  // the last overlaps the one before
      hn::StoreU(hn::Zero(Bytes()), Bytes(), map + column);
      possible.keepIf(mayHoldCorners<2>({row + column, stride}, thresholds), column);
    }
    for (const std::size_t column : possible) {
      const Circles circles = {row + column, stride};
      if (!mayHoldCorners<4>(circles, thresholds)) continue;  // many in noise, else hardly any
      const ByteVector score = scores<arc>(circles, thresholds);
      hn::StoreU(score, Bytes(), map + column);
      any = hn::Or(any, score);
    }
  }
  return !allZero(any);
}

bool fastScoreRow(const std::uint8_t* row, std::ptrdiff_t stride, std::size_t begin,
                  std::size_t end, int arc, int threshold, std::uint8_t* map) {
  switch (arc) {
    case 9:
      return scoreRow<9>(row, stride, begin, end, threshold, map);
    case 10:
      return scoreRow<10>(row, stride, begin, end, threshold, map);
    case 11:
      return scoreRow<11>(row, stride, begin, end, threshold, map);
    default:
      return scoreRow<12>(row, stride, begin, end, threshold, map);
  }
}

// Lists the columns x + i of the lanes i that are set.
HWY_INLINE std::size_t listLanes(hn::Mask<Bytes> mask, std::size_t x, int y, xy* corners) {
  std::uint64_t words[(HWY_MAX_BYTES + 63) / 64] = {};
  hn::StoreMaskBits(Bytes(), mask, reinterpret_cast<std::uint8_t*>(words));
  std::size_t count = 0;
  for (std::size_t first = 0; first < hn::Lanes(Bytes()); first += 64) {
    for (std::uint64_t bits = words[first / 64]; bits != 0; bits &= bits - 1) {
      corners[count++] = {static_cast<int>(x + first + std::countr_zero(bits)), y};
    }
  }
  return count;
}

std::size_t fastListCorners(const std::uint8_t* scores, std::size_t begin, std::size_t end, int y,
                            xy* corners) {
  const std::size_t lanes = hn::Lanes(Bytes());
  std::size_t count = 0, x = begin;
  for (; x + lanes <= end; x += lanes) {
    const ByteVector score = hn::LoadU(Bytes(), scores + x);
    if (allZero(score)) continue;
    count += listLanes(hn::Ne(score, hn::Zero(Bytes())), x, y, corners + count);
  }
  return count + fastListCornersScalar(scores, x, end, y, corners + count);
}

HWY_INLINE ByteVector greatestOfThree(const std::uint8_t* middle) {
  const Bytes bytes;
  return hn::Max(hn::Max(hn::LoadU(bytes, middle - 1), hn::LoadU(bytes, middle)),
                 hn::LoadU(bytes, middle + 1));
}

std::size_t fastListMaxima(const std::uint8_t* above, const std::uint8_t* scores,
                           const std::uint8_t* below, std::size_t begin, std::size_t end, int y,
                           xy* corners) {
  const Bytes bytes;
  const std::size_t lanes = hn::Lanes(bytes);
  std::size_t count = 0, x = begin;
  while (x + lanes <= end) {
    Columns withCorners;
    for (std::size_t tested = 0; tested < Columns::room && x + lanes <= end; ++tested, x += lanes) {
      withCorners.keepIf(!allZero(hn::LoadU(bytes, scores + x)), x);
    }
    for (const std::size_t column : withCorners) {
      const ByteVector score = hn::LoadU(bytes, scores + column);
      const ByteVector beside =
          hn::Max(hn::LoadU(bytes, scores + column - 1), hn::LoadU(bytes, scores + column + 1));
      const ByteVector neighbour = hn::Max(
          beside, hn::Max(greatestOfThree(above + column), greatestOfThree(below + column)));
      count += listLanes(hn::Gt(score, neighbour), column, y, corners + count);
    }
  }
  return count + fastListMaximaScalar(above, scores, below, x, end, y, corners + count);
}

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();
#if HWY_ONCE
namespace pelorin::image_processing {

HWY_EXPORT(fastScoreRow);
bool fastScoreRow(const std::uint8_t* row, std::ptrdiff_t stride, std::size_t begin,
                  std::size_t end, int arc, int threshold, std::uint8_t* scores) {
  return HWY_DYNAMIC_DISPATCH(fastScoreRow)(row, stride, begin, end, arc, threshold, scores);
}

HWY_EXPORT(fastListCorners);
std::size_t fastListCorners(const std::uint8_t* scores, std::size_t begin, std::size_t end, int y,
                            xy* corners) {
  return HWY_DYNAMIC_DISPATCH(fastListCorners)(scores, begin, end, y, corners);
}

HWY_EXPORT(fastListMaxima);
std::size_t fastListMaxima(const std::uint8_t* above, const std::uint8_t* scores,
                           const std::uint8_t* below, std::size_t begin, std::size_t end, int y,
                           xy* corners) {
  return HWY_DYNAMIC_DISPATCH(fastListMaxima)(above, scores, below, begin, end, y, corners);
}

}  // namespace pelorin::image_processing
#endif
