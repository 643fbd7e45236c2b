#pragma once

#include <array>
#include <cstdint>
#include <vector>

#include "image_processing/core/image.h"
#include "photo/picture_size.h"

namespace pelorin::photo {

/// The largest size of the picture's shape that fits the box; a picture smaller than the box keeps
/// its own. Both sides of the result are at least 1, however thin the picture.
PictureSize fitWithin(PictureSize picture, PictureSize box);

/// `areaAverage` of a picture whose rows come one after the other.
class AreaAverage {
 public:
  /// @param picture, size  as for `areaAverage`.
  /// @throws std::bad_alloc.
  AreaAverage(PictureSize picture, PictureSize size);

  /// The next row, of the picture's width. Never throws.
  void addRow(const image_processing::RGBA8Pixel* row);

  /// The picture, once all rows were added.
  const image_processing::Image<image_processing::RGBA8Pixel>& result() const { return result_; }

 private:
  /// Red, green and blue, summed with weights.
  using ColourSum = std::array<std::uint64_t, 3>;

  void sumAlong(const image_processing::RGBA8Pixel* row);
  void finishLine();

  PictureSize picture_, size_;
  image_processing::Image<image_processing::RGBA8Pixel> result_;
  std::vector<ColourSum> lineSums_, sums_;
  // Of the rows so far and of the new line, in parts of which an old row has `size_.height` and a
  // new line `picture_.height`.
  std::uint64_t rowsEnd_ = 0, position_ = 0;
  std::uint32_t line_ = 0;  // the new one that is being summed
};

/// The picture at another size: each new pixel is the average of the area of old pixels that it
/// covers, fractions included, rounded to nearest; alpha is 255. Averages bytes as they are (gamma
/// encoded), exactly, so that a flat picture stays as it is.
/// @param picture  at least one pixel.
/// @param size     both sides at least 1; meant to be smaller than the picture.
/// @throws std::bad_alloc when the result does not fit into memory.
image_processing::Image<image_processing::RGBA8Pixel> areaAverage(
    const image_processing::Image<image_processing::RGBA8Pixel>& picture, PictureSize size);

}  // namespace pelorin::photo
