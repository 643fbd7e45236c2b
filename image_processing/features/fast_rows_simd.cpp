#include "image_processing/features/fast_corner.h"
#include "image_processing/features/fast_rows.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/features/fast_rows_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

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

  template <int i>
  HWY_INLINE ByteVector pixel() const {
    constexpr xy step = fastCircle[i % 16];
    return hn::LoadU(Bytes(), centre + step.y * stride + step.x);
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
  template <int first, int count>
  HWY_INLINE ByteVector greatest() const {
    if constexpr (count == 1) {
      return pixel<first>();
    } else {
      constexpr int half = std::bit_ceil(static_cast<unsigned>(count)) / 2;
      return hn::Max(greatest<first % 16, half>(), greatest<(first + half) % 16, count - half>());
    }
  }

  // The largest, over the arcs, of the least value on an arc. The arcs that start at `first` - 1
  // and at `first` have all but one pixel in common.
  template <int arc, int first = 0>
  HWY_INLINE ByteVector brightestArc() const {
    const ByteVector either = hn::Max(pixel<first + 15>(), pixel<first + arc - 1>());
    const ByteVector two = hn::Min(least<first, arc - 1>(), either);
    if constexpr (first == 14) {
      return two;
    } else {
      return hn::Max(two, brightestArc<arc, first + 2>());
    }
  }
  template <int arc, int first = 0>
  HWY_INLINE ByteVector darkestArc() const {
    const ByteVector either = hn::Min(pixel<first + 15>(), pixel<first + arc - 1>());
    const ByteVector two = hn::Max(greatest<first, arc - 1>(), either);
    if constexpr (first == 14) {
      return two;
    } else {
      return hn::Min(two, darkestArc<arc, first + 2>());
    }
  }

  // What remains of the brighter, or darker, pixels of two pairs of opposite ones.
  template <int first>
  HWY_INLINE ByteVector brighterOfOpposites() const {
    return hn::Min(hn::Max(pixel<first>(), pixel<first + 8>()),
                   hn::Max(pixel<first + 4>(), pixel<first + 12>()));
  }
  template <int first>
  HWY_INLINE ByteVector darkerOfOpposites() const {
    return hn::Max(hn::Min(pixel<first>(), pixel<first + 8>()),
                   hn::Min(pixel<first + 4>(), pixel<first + 12>()));
  }
};

HWY_INLINE bool allZero(ByteVector bytes) {
  return hn::AllTrue(Bytes(), hn::Eq(bytes, hn::Zero(Bytes())));
}

// False where no pixel is a corner, as four or eight pixels of the circle tell: every arc of nine
// or more holds a pixel of each pair of opposite ones.
HWY_INLINE bool mayHoldCorners(const Circles circles, ByteVector threshold) {
  const ByteVector centre = hn::LoadU(Bytes(), circles.centre);
  const ByteVector high = hn::SaturatedAdd(centre, threshold);
  const ByteVector low = hn::SaturatedSub(centre, threshold);

  ByteVector bright = circles.brighterOfOpposites<0>();
  ByteVector dark = circles.darkerOfOpposites<0>();
  if (allZero(hn::Or(hn::SaturatedSub(bright, high), hn::SaturatedSub(low, dark)))) return false;

  bright = hn::Min(bright, circles.brighterOfOpposites<2>());
  dark = hn::Max(dark, circles.darkerOfOpposites<2>());
  return !allZero(hn::Or(hn::SaturatedSub(bright, high), hn::SaturatedSub(low, dark)));
}

template <int arc>
HWY_INLINE ByteVector scores(const Circles circles, ByteVector threshold) {
  const ByteVector centre = hn::LoadU(Bytes(), circles.centre);
  const ByteVector difference = hn::Max(hn::SaturatedSub(circles.brightestArc<arc>(), centre),
                                        hn::SaturatedSub(centre, circles.darkestArc<arc>()));
  return hn::IfThenElseZero(hn::Gt(difference, threshold), difference);
}

template <int arc>
bool scoreRow(const std::uint8_t* row, std::ptrdiff_t stride, std::size_t begin, std::size_t end,
              int threshold, std::uint8_t* map) {
  const std::size_t lanes = hn::Lanes(Bytes());
  if (end - begin < lanes) {
    return fastScoreRowScalar(row, stride, begin, end, arc, threshold, map);
  }
  const ByteVector thresholds = hn::Set(Bytes(), static_cast<std::uint8_t>(threshold));
  ByteVector any = hn::Zero(Bytes());
  for (std::size_t x = begin; x < end; x += lanes) {
    if (x + lanes > end) x = end - lanes;  // the last vector overlaps the one before
    const Circles circles = {row + x, stride};
    if (!mayHoldCorners(circles, thresholds)) {
      hn::StoreU(hn::Zero(Bytes()), Bytes(), map + x);
      continue;
    }
    const ByteVector score = scores<arc>(circles, thresholds);
    hn::StoreU(score, Bytes(), map + x);
    any = hn::Or(any, score);
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
  for (; x + lanes <= end; x += lanes) {
    const ByteVector score = hn::LoadU(bytes, scores + x);
    if (allZero(score)) continue;
    const ByteVector beside =
        hn::Max(hn::LoadU(bytes, scores + x - 1), hn::LoadU(bytes, scores + x + 1));
    const ByteVector neighbour =
        hn::Max(beside, hn::Max(greatestOfThree(above + x), greatestOfThree(below + x)));
    count += listLanes(hn::Gt(score, neighbour), x, y, corners + count);
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
