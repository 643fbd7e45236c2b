#pragma once

#include <algorithm>
#include <cstdint>
#include <utility>

#include "image_processing/core/image.h"
#include "image_processing/core/rows.h"

namespace pelorin::image_processing {

/// The rows of a picture that is in memory.
class PictureSource : public RowSource {
 public:
  /// Shares the pixels.
  explicit PictureSource(Image<RGBA8Pixel> picture) : picture_(std::move(picture)) {}

  const RGBA8Pixel* next(std::uint32_t count, RGBA8Pixel*) override {
    const RGBA8Pixel* const rows = picture_.row(next_);
    next_ += count;
    return rows;
  }
  const RGBA8Pixel* standing() const override { return picture_.row(next_); }

 private:
  Image<RGBA8Pixel> picture_;
  std::uint32_t next_ = 0;
};

/// A picture that is written row by row.
class PictureSink : public RowSink {
 public:
  /// Shares the pixels.
  explicit PictureSink(Image<RGBA8Pixel> picture) : picture_(std::move(picture)) {}

  void write(const RGBA8Pixel* rows, std::uint32_t count) override {
    std::copy_n(rows, std::size_t{picture_.width} * count, picture_.row(next_));
    next_ += count;
  }

 private:
  Image<RGBA8Pixel> picture_;
  std::uint32_t next_ = 0;
};

}  // namespace pelorin::image_processing
