#pragma once

#include <cstdint>
#include <vector>

#include "image_processing/autoenhance/lightness/lightness_histogram.h"
#include "image_processing/core/image_metadata.h"
#include "image_processing/core/pixel_types.h"

namespace pelorin::image_processing {

/// Counts the pixels of a photo's faces by lightness, a row at a time: a pixel in several boxes
/// counts once for each, yet is looked at once however many boxes there are.
class FaceLightness {
 public:
  /// @param bins  at least 1. Boxes may reach out of the photo; null ones are none.
  /// @throws std::bad_alloc.
  FaceLightness(const ImageMetadata& metadata, std::uint32_t width, std::uint32_t height, int bins,
                float scale);

  /// Counts the `width` pixels of row `y`, which is below those before. @throws std::bad_alloc.
  void addRow(std::uint32_t y, const RGBA8Pixel* pixels);

  /// Counts what `other` has counted, of other rows of the same photo. Never throws.
  void add(const FaceLightness& other) { histogram_.add(other.histogram_); }

  /// The first entry at which the CDF of the rows so far reaches one half; -1 without face pixels,
  /// or when that is the last entry. @throws std::bad_alloc.
  std::int32_t medianBin() const;

 private:
  // Where a box begins or has ended: from row `y` on, `change` more boxes lie over the columns from
  // `left` to before `end`.
  struct Edge {
    std::int64_t y;
    std::uint32_t left, end;
    int change;
  };
  // Neighbouring columns under equally many boxes.
  struct Run {
    std::uint32_t first, count;
    std::uint64_t boxes;
  };

  void findRuns();

  LightnessHistogram histogram_;
  std::vector<Edge> edges_;            // by row
  std::size_t nextEdge_ = 0;           // the first that is not in `changes_`
  std::vector<std::int64_t> changes_;  // boxes of a column less those of the one before
  std::vector<Run> runs_;              // of the row, from left to right; none without boxes
  std::vector<std::uint16_t> steps_;   // of the row's pixels from the first run to the last
};

}  // namespace pelorin::image_processing
