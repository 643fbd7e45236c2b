#pragma once

#include <cstdint>
#include <vector>

#include "image_processing/autoenhance/masks/grid.h"
#include "image_processing/core/image.h"

namespace pelorin::image_processing {

/// Reads the grid back at every pixel: values and weights interpolated along y, then x, then
/// lightness, and divided; where the weight is 0 the value stands alone.
/// @param smoothed  written; of the size of `lightness`.
/// May throw std::bad_alloc. For T = float and QuantizedFloat<unsigned char>.
template <typename T>
void slice(const Grid& grid, const Image<float>& lightness, float cellSize, Image<T>& smoothed);

/// The definition of `slice`.
template <typename T>
void sliceScalar(const Grid& grid, const Image<float>& lightness, float cellSize,
                 Image<T>& smoothed);

/// Pixels of a row that lie between the same two columns of the grid.
struct SliceRun {
  std::uint32_t first, end;
  std::int64_t before, after;
};

/// A column of the grid interpolated along y, laid out as the instruction set likes to read it.
struct alignas(64) SliceColumn {
  float nodes[2 * gridBins + 2];
};

/// `slice` a row at a time.
class GridSlicer {
 public:
  /// Holds on to `grid`. @throws std::bad_alloc.
  GridSlicer(const Grid& grid, std::uint32_t width, float cellSize);

  /// Row `y`. Uses the slicer's own memory, so one row at a time. Never throws.
  template <typename T>
  void sliceRow(std::uint32_t y, const float* lightness, T* smoothed);

  /// Pixels that are sliced together; no run crosses a multiple of it.
  static constexpr std::uint32_t blockSize = 512;
  /// Floats behind the pixels that vectors may touch.
  static constexpr std::uint32_t padding = 16;

 private:
  const Grid& grid_;
  std::uint32_t width_;
  float cellSize_;
  std::vector<SliceRun> runs_;
  std::vector<float> fractions_;      // along x, by pixel
  std::vector<SliceColumn> columns_;  // the grid at the current row
};

}  // namespace pelorin::image_processing
