#pragma once

#include <algorithm>
#include <cstdint>
#include <vector>

#include "image_processing/autoenhance/masks/flatness_rows.h"
#include "image_processing/autoenhance/masks/mirror.h"
#include "image_processing/autoenhance/masks/summed_area_rows.h"
#include "image_processing/core/checked_size.h"

namespace pelorin::image_processing {

/// The summed-area table of a flatness mask, formed from the top in groups of `sumRowsAtOnce` rows,
/// of which only those are held that a window spans. Its rows are those of the picture, mirrored at
/// both ends: row `radius` is the picture's first.
///
/// Rows are weighed in any order and by any thread, one for each; a group is summed when all its
/// rows are weighed and the group above it is summed.
class FlatnessTable {
 public:
  /// @param radius         half-size of the window, at least 0.
  /// @param groupsAtOnce   how many groups may be weighed before the first of them was shaped.
  /// @throws std::bad_alloc when about 2 · radius rows of floats do not fit.
  FlatnessTable(std::uint32_t width, std::uint32_t height, int radius, int groupsAtOnce = 1)
      : width_(width),
        height_(height),
        radius_(radius),
        window_(2 * radius_ + 1),
        weight_(flatnessWeight(window_)),
        // An odd number of cache lines a row: rows at the same place in a page would evict each
        // other.
        stride_((((width_ + window_ + sumRowsPadding) / 16 + 1) | 1) * 16),
        // Whole groups, so that the rows of one follow each other.
        held_((window_ + (groupsAtOnce + 1) * sumRowsAtOnce - 1) / sumRowsAtOnce * sumRowsAtOnce),
        sums_(checkedProduct(stride_, std::uint64_t(held_), sizeof(float)) / sizeof(float)),
        zeros_(stride_) {}

  /// Rows of the table: those of the picture and of a window.
  std::int64_t height() const { return height_ + window_; }

  /// The row of the picture that row `i` is made of.
  std::uint32_t sourceOf(std::int64_t i) const {
    return static_cast<std::uint32_t>(reflectInto(i - radius_, height_));
  }

  /// The first row that is made of row `y` of the picture.
  std::int64_t firstOf(std::uint32_t y) const {
    if (y > radius_) return y + radius_;
    return y == std::min(radius_, height_ - 1) ? 0 : radius_ - y;
  }

  /// The end of the rows of the picture that the first `end` rows of the table are made of.
  std::uint32_t sourceEnd(std::int64_t end) const {
    return static_cast<std::uint32_t>(std::min(std::max(radius_ + 1, end - radius_), height_));
  }

  /// The end of the rows of the mask that can be shaped when the first `end` rows are summed.
  std::uint32_t shapedEnd(std::int64_t end) const {
    return static_cast<std::uint32_t>(std::max<std::int64_t>(end - window_, 0));
  }

  /// Weighs row `i`. Never throws.
  /// @param lightness, smoothed  row `sourceOf(i)` of the picture.
  template <typename T>
  void weigh(std::int64_t i, const float* lightness, const T* smoothed) {
    float* const weights = row(i);
    float* const middle = weights + radius_;
    const std::int64_t width = width_, r = radius_, tableWidth = width + window_;
    weighRow(weight_, lightness, smoothed, middle, static_cast<std::size_t>(width));
    for (std::int64_t j = 0; j < r; ++j) weights[j] = middle[reflectInto(j - r, width)];
    for (std::int64_t j = r + width; j < tableWidth; ++j) {
      weights[j] = middle[reflectInto(j - r, width)];
    }
    std::fill_n(weights + tableWidth, sumRowsPadding, 0.0f);
  }

  /// Sums the group that starts at row `i`. Never throws.
  void sum(std::int64_t i) {
    const float* const above = i == 0 ? zeros_.data() : row(i - 1);
    sumRows(above, row(i), static_cast<std::ptrdiff_t>(stride_), width_ + window_);
  }

  /// Row `y` of the mask. Never throws.
  template <typename T>
  void shape(std::uint32_t y, T* mask) const {
    shapeRow(row(y), row(y + window_), static_cast<std::ptrdiff_t>(window_), shape_, mask,
             static_cast<std::size_t>(width_));
  }

 private:
  float* row(std::int64_t i) { return &sums_[static_cast<std::size_t>((i % held_) * stride_)]; }
  const float* row(std::int64_t i) const {
    return &sums_[static_cast<std::size_t>((i % held_) * stride_)];
  }

  std::int64_t width_, height_, radius_, window_;
  GaussianApproximation<float> weight_;
  FlatnessShape shape_;
  std::int64_t stride_, held_;
  std::vector<float> sums_;
  std::vector<float> zeros_;  // above the first row
};

}  // namespace pelorin::image_processing
