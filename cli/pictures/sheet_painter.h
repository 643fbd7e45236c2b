#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "photo/area_average.h"

namespace pelorin::cli {

/// What stands on a sheet of small pictures: one row a photo, one column a way of treating it.
struct SheetPlan {
  std::string title;                      ///< May be empty; the heading is then left out.
  std::vector<std::string> columnLabels;  ///< At least one.
  std::vector<photo::PictureSize>
      thumbnailSizes;  ///< Of each row's pictures, both sides at least 1.
};

/// Draws a sheet band by band, so that it never has to be in memory as a whole: the heading first,
/// then each row, all of them `width()` wide. Keeps no state between bands.
class SheetPainter {
 public:
  static constexpr std::uint32_t greatestHeight = 65500;  ///< What a JPEG file holds.

  explicit SheetPainter(SheetPlan plan);

  /// Size of the whole sheet; 64-bit, since nothing bounds a plan.
  std::uint64_t width() const;
  std::uint64_t height() const;

  /// Whether the sheet is no wider than Cairo draws and no higher than `greatestHeight`. Only then may the bands be
  /// asked for.
  bool fits() const;

  /// What the plan says of row `index`.
  photo::PictureSize thumbnailSize(std::size_t index) const { return plan_.thumbnailSizes[index]; }

  /// Title and upper margin.
  image_processing::Image<image_processing::RGBA8Pixel> heading() const;

  /// A photo's name over its pictures, the column's label under each of them.
  /// @param index       the row, from 0; gives the height.
  /// @param thumbnails  one a column, none larger than the plan says; or none at all, when the
  ///                    photo could not be read: `note` then stands in their place.
  image_processing::Image<image_processing::RGBA8Pixel> row(
      std::size_t index, std::string_view label,
      const std::vector<image_processing::Image<image_processing::RGBA8Pixel>>& thumbnails,
      std::string_view note = {}) const;

 private:
  std::uint32_t headingHeight() const;
  std::uint64_t rowHeight(std::size_t index) const;

  SheetPlan plan_;
  std::uint64_t columnWidth_;
};

}  // namespace pelorin::cli
