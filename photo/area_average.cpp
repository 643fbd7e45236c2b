#include "photo/area_average.h"

#include <algorithm>
#include <array>
#include <vector>

namespace pelorin::photo {

using image_processing::Image;
using image_processing::RGBA8Pixel;

namespace {

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

AreaAverage::AreaAverage(PictureSize picture, PictureSize size)
    : picture_(picture),
      size_(size),
      result_(size.width, size.height),
      lineSums_(size.width),
      sums_(size.width) {}

void AreaAverage::sumAlong(const RGBA8Pixel* row) {
  std::fill(lineSums_.begin(), lineSums_.end(), ColourSum{});
  forEachOverlap(picture_.width, size_.width,
                 [&](std::uint64_t to, std::uint64_t from, std::uint64_t weight) {
                   const RGBA8Pixel& p = row[from];
                   ColourSum& sum = lineSums_[to];
                   sum[0] += weight * p.r;
                   sum[1] += weight * p.g;
                   sum[2] += weight * p.b;
                 });
}

void AreaAverage::addRow(const RGBA8Pixel* row) {
  sumAlong(row);
  rowsEnd_ += size_.height;
  while (position_ < rowsEnd_) {  // the row may lie in two new lines
    const std::uint64_t lineEnd = (std::uint64_t{line_} + 1) * picture_.height;
    const std::uint64_t end = std::min(rowsEnd_, lineEnd);
    for (std::uint32_t x = 0; x < size_.width; ++x) {
      for (int c = 0; c < 3; ++c) sums_[x][c] += (end - position_) * lineSums_[x][c];
    }
    position_ = end;
    if (end == lineEnd) finishLine();
  }
}

void AreaAverage::finishLine() {
  const std::uint64_t area = std::uint64_t{picture_.width} * picture_.height;
  RGBA8Pixel* const line = result_.row(line_++);
  for (std::uint32_t x = 0; x < size_.width; ++x) {
    line[x] = {roundedShare(sums_[x][0], area), roundedShare(sums_[x][1], area),
               roundedShare(sums_[x][2], area), 255};
  }
  std::fill(sums_.begin(), sums_.end(), ColourSum{});
}

Image<RGBA8Pixel> areaAverage(const Image<RGBA8Pixel>& picture, PictureSize size) {
  AreaAverage average({picture.width, picture.height}, size);
  for (std::uint32_t y = 0; y < picture.height; ++y) average.addRow(picture.row(y));
  return average.result();
}

}  // namespace pelorin::photo
