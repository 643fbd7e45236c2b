#include "image_processing/features/fast_detector.h"

#include <algorithm>
#include <array>

#include "image_processing/features/fast_corner.h"
#include "image_processing/features/fast_rows.h"

namespace pelorin::image_processing {
namespace {

constexpr std::size_t firstRoom = 512;  // corners

// Rows and columns that may hold corners.
struct Inside {
  explicit Inside(const GreyPixels& image)
      : right(image.pixels == nullptr ? 0 : std::max(image.width, fastBorder) - fastBorder),
        bottom(image.pixels == nullptr ? 0 : std::max(image.height, fastBorder) - fastBorder) {}
  bool empty() const { return right <= left || bottom <= top; }

  static constexpr int left = fastBorder, top = fastBorder;
  int right, bottom;  // the first that may not
};

const std::uint8_t* rowOf(const GreyPixels& image, int y) {
  return image.pixels + y * image.stride;
}

// Below 0 pixels that do not differ make corners: a corner's score can be anything, so there is no
// map of bytes. Nobody looks for such corners; they only have to be right.
MallocArray<xy> detectCornersBelowZero(const GreyPixels& image, const Inside& inside, int arc,
                                       int threshold) {
  MallocArray<xy> corners(firstRoom);
  for (int y = inside.top; y < inside.bottom; ++y) {
    for (int x = inside.left; x < inside.right; ++x) {
      const std::uint8_t* const centre = rowOf(image, y) + x;
      if (isCorner(*centre, circleAround(centre, image.stride), arc, threshold)) {
        corners.append({x, y});
      }
    }
  }
  return corners;
}

bool inRasterOrder(const xy& a, const xy& b) {
  return a.y < b.y || (a.y == b.y && a.x <= b.x);
}

// Whether `corner` comes before column `x` of row `y`; wider numbers than a corner's, for its
// neighbours at the ends of the range.
bool isBefore(const xy& corner, std::int64_t x, std::int64_t y) {
  return corner.y < y || (corner.y == y && corner.x < x);
}

}  // namespace

MallocArray<xy> detectCorners(const GreyPixels& image, int arc, int threshold) {
  const Inside inside(image);
  if (inside.empty() || threshold >= 255) return MallocArray<xy>(firstRoom);
  if (threshold < 0) return detectCornersBelowZero(image, inside, arc, threshold);

  MallocArray<xy> corners(firstRoom);
  const MallocArray<std::uint8_t> scores(static_cast<std::size_t>(inside.right));
  for (int y = inside.top; y < inside.bottom; ++y) {
    if (!fastScoreRow(rowOf(image, y), image.stride, inside.left, inside.right, arc, threshold,
                      scores.data())) {
      continue;
    }
    corners.makeRoomFor(static_cast<std::size_t>(inside.right));
    corners.grow(fastListCorners(scores.data(), inside.left, inside.right, y, corners.end()));
  }
  return corners;
}

MallocArray<int> scoreCorners(const GreyPixels& image, const xy* corners, std::size_t count,
                              int arc, int threshold) {
  MallocArray<int> scores(count);
  for (std::size_t i = 0; i < count; ++i) {
    const std::uint8_t* const centre = rowOf(image, corners[i].y) + corners[i].x;
    scores.append(cornerScore(*centre, circleAround(centre, image.stride), arc, threshold));
  }
  return scores;
}

MallocArray<xy> keepMaxima(const xy* corners, const int* scores, std::size_t count) {
  for (std::size_t i = 1; i < count; ++i) {
    if (!inRasterOrder(corners[i - 1], corners[i])) return {};
  }
  if (count == 0) return {};

  MallocArray<xy> kept(count);
  std::size_t above = 0, below = 0;
  for (std::size_t i = 0; i < count; ++i) {
    const std::int64_t x = corners[i].x, y = corners[i].y;
    const auto beats = [&](std::size_t other) { return scores[other] >= scores[i]; };
    const auto isAt = [&](std::size_t other, std::int64_t column) {
      return corners[other].y == y && corners[other].x == column;
    };
    // `from` moves along row `row` as i moves along row y.
    const auto isBeatenFrom = [&](std::size_t& from, std::int64_t row) {
      while (from < count && isBefore(corners[from], x - 1, row)) ++from;
      for (std::size_t j = from; j < count && isBefore(corners[j], x + 2, row); ++j) {
        if (beats(j)) return true;
      }
      return false;
    };
    const bool beatenBeside = (i > 0 && isAt(i - 1, x - 1) && beats(i - 1)) ||
                              (i + 1 < count && isAt(i + 1, x + 1) && beats(i + 1));
    if (!beatenBeside && !isBeatenFrom(above, y - 1) && !isBeatenFrom(below, y + 1)) {
      kept.append(corners[i]);
    }
  }
  return kept;
}

MallocArray<xy> detectMaxima(const GreyPixels& image, int arc, int threshold) {
  const Inside inside(image);
  if (inside.empty() || threshold >= 255) return {};
  if (threshold < 0) {
    const MallocArray<xy> corners = detectCorners(image, arc, threshold);
    const MallocArray<int> scores =
        scoreCorners(image, corners.data(), corners.size(), arc, threshold);
    return keepMaxima(corners.data(), scores.data(), corners.size());
  }

  const std::size_t width = static_cast<std::size_t>(image.width);
  const MallocArray<std::uint8_t> map(checkedProduct(3, width));
  std::fill_n(map.data(), 3 * width, std::uint8_t{0});  // the borders stay 0
  std::array<std::uint8_t*, 3> rows = {map.data(), map.data() + width, map.data() + 2 * width};

  MallocArray<xy> maxima;
  bool cornersInRow = false, cornersInRowBefore = false;
  for (int y = inside.top; y <= inside.bottom; ++y, cornersInRowBefore = cornersInRow) {
    const auto [above, scores, below] = rows;  // of row y - 1; `below` is row y
    if (y < inside.bottom) {
      cornersInRow = fastScoreRow(rowOf(image, y), image.stride, inside.left, inside.right, arc,
                                  threshold, below);
    } else {
      std::fill_n(below, width, std::uint8_t{0});
    }
    if (cornersInRowBefore) {
      maxima.makeRoomFor(width);
      maxima.grow(
          fastListMaxima(above, scores, below, inside.left, inside.right, y - 1, maxima.end()));
    }
    rows = {scores, below, above};
  }
  return maxima;
}

}  // namespace pelorin::image_processing
