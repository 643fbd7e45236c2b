#pragma once

#include <algorithm>
#include <cstdint>
#include <vector>

#include "image_processing/core/image.h"
#include "image_processing/core/stages.h"
#include "image_processing/filters/row_filter.h"

namespace pelorin::image_processing {

/// The bands of a picture that comes as rows, of which those are held that are under way.
class RowBands {
 public:
  /// @param stages  how many have use for a band's rows, the one that reads them included.
  /// @throws std::bad_alloc.
  RowBands(std::uint32_t width, std::uint32_t height, const RowWork& work, std::size_t stages)
      : height_(height),
        bandHeight_(std::min(work.bandHeight, height)),
        pixels_(static_cast<std::size_t>(bandsUnderWay(stages, work.workers))) {
    for (std::size_t i = 0; i < pixels_.size(); ++i) rooms_.emplace_back(width, bandHeight_);
  }

  std::int64_t count() const {
    return height_ == 0 ? 0 : (std::int64_t{height_} + bandHeight_ - 1) / bandHeight_;
  }
  std::uint32_t first(std::int64_t band) const {
    return static_cast<std::uint32_t>(band) * bandHeight_;
  }
  std::uint32_t rows(std::int64_t band) const {
    return std::min(bandHeight_, height_ - first(band));
  }

  /// Band after band.
  void read(std::int64_t band, RowSource& source) {
    pixels_[place(band)] = source.next(rows(band), rooms_[place(band)].data.get());
  }
  const RGBA8Pixel* pixels(std::int64_t band) const { return pixels_[place(band)]; }

 private:
  std::size_t place(std::int64_t band) const {
    return static_cast<std::size_t>(band) % pixels_.size();
  }

  std::uint32_t height_, bandHeight_;
  std::vector<Image<RGBA8Pixel>> rooms_;
  std::vector<const RGBA8Pixel*> pixels_;
};

}  // namespace pelorin::image_processing
