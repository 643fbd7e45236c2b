#include "photo/area_average.h"

#include <algorithm>
#include <array>
#include <vector>

namespace pelorin::photo {

using image_processing::Image;
using image_processing::RGBA8Pixel;

namespace {

/// Red, green and blue, summed with weights.
using ColourSum = std::array<std::uint64_t, 3>;

/// Calls visit(to, from, weight) for all pairs of a new and an old pixel of one line that overlap.
/// Lengths are counted in parts so small that both grids fall on them: an old pixel is `to` parts
/// long and a new one `from` parts, so that the weights of a new pixel sum to `from`.
template <typename Visit>
void forEachOverlap(std::uint64_t from, std::uint64_t to, Visit visit) {
  std::uint64_t position = 0;
  for (std::uint64_t i = 0, o = 0; o < to;) {
    const std::uint64_t oldEnd = (i + 1) * to, newEnd = (o + 1) * from;
    const std::uint64_t end = std::min(oldEnd, newEnd);
    visit(o, i, end - position);
    position = end;
    if (end == oldEnd) ++i;
    if (end == newEnd) ++o;
  }
}

std::uint8_t roundedShare(std::uint64_t sum, std::uint64_t area) {
  return static_cast<std::uint8_t>((sum + area / 2) / area);
}

}  // namespace

PictureSize fitWithin(PictureSize picture, PictureSize box) {
  if (picture.width <= box.width && picture.height <= box.height) return picture;
  const std::uint64_t w = picture.width, h = picture.height;
  const auto scaled = [](std::uint64_t side, std::uint64_t numerator, std::uint64_t denominator) {
    return static_cast<std::uint32_t>(
        std::max<std::uint64_t>(1, (side * numerator + denominator / 2) / denominator));
  };
  if (w * box.height >= h * box.width) return {box.width, scaled(h, box.width, w)};
  return {scaled(w, box.height, h), box.height};
}

Image<RGBA8Pixel> areaAverage(const Image<RGBA8Pixel>& picture, PictureSize size) {
  Image<RGBA8Pixel> result(size.width, size.height);
  const std::uint64_t area = std::uint64_t{picture.width} * picture.height;
  std::vector<ColourSum> lineSums(size.width), sums(size.width);
  std::uint64_t summedLine = UINT64_MAX;
  const auto sumAlongLine = [&](std::uint64_t y) {
    if (y == summedLine) return;  // the line lies in two new lines
    summedLine = y;
    std::fill(lineSums.begin(), lineSums.end(), ColourSum{});
    const RGBA8Pixel* line = picture.row(static_cast<std::uint32_t>(y));
    forEachOverlap(picture.width, size.width,
                   [&](std::uint64_t to, std::uint64_t from, std::uint64_t weight) {
                     const RGBA8Pixel& p = line[from];
                     ColourSum& sum = lineSums[to];
                     sum[0] += weight * p.r;
                     sum[1] += weight * p.g;
                     sum[2] += weight * p.b;
                   });
  };
  std::uint64_t heightLeft = picture.height;  // of the new line being summed
  forEachOverlap(picture.height, size.height,
                 [&](std::uint64_t to, std::uint64_t from, std::uint64_t weight) {
                   sumAlongLine(from);
                   for (std::uint32_t x = 0; x < size.width; ++x) {
                     for (int c = 0; c < 3; ++c) sums[x][c] += weight * lineSums[x][c];
                   }
                   heightLeft -= weight;
                   if (heightLeft > 0) return;
                   RGBA8Pixel* line = result.row(static_cast<std::uint32_t>(to));
                   for (std::uint32_t x = 0; x < size.width; ++x) {
                     line[x] = {roundedShare(sums[x][0], area), roundedShare(sums[x][1], area),
                                roundedShare(sums[x][2], area), 255};
                   }
                   std::fill(sums.begin(), sums.end(), ColourSum{});
                   heightLeft = picture.height;
                 });
  return result;
}

}  // namespace pelorin::photo
