#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <vector>

#include "image_processing/core/image.h"
#include "photo/picture_size.h"

namespace pelorin::photo {

/// A small JPEG file of a picture.
struct Thumbnail {
  std::vector<std::uint8_t> file;
  PictureSize size;
};

/// Makes thumbnails of one picture: DCF's kind, without application segments.
class ThumbnailMaker {
 public:
  using Picture = image_processing::Image<image_processing::RGBA8Pixel>;

  /// Of a picture that is there and outlives this.
  explicit ThumbnailMaker(const Picture& picture);

  /// Of a picture of this size that comes row by row. Who will want a thumbnail asks for it before
  /// the first row, and gets nothing; then after the last.
  explicit ThumbnailMaker(PictureSize size);

  ~ThumbnailMaker();
  ThumbnailMaker(const ThumbnailMaker&) = delete;
  ThumbnailMaker& operator=(const ThumbnailMaker&) = delete;

  /// The next rows, back to back. Never throws.
  void addRows(const image_processing::RGBA8Pixel* rows, std::uint32_t count);

  /// @param longerSide  in pixels; a smaller picture keeps its size.
  /// @param room        bytes that the file must fit; quality falls from 95 to 40 for it.
  /// @returns nothing when even the lowest quality does not fit.
  std::optional<Thumbnail> make(std::uint32_t longerSide, std::size_t room);

 private:
  class Reduction;

  PictureSize whole_;
  const Picture* picture_ = nullptr;  // null where rows come
  std::uint32_t rows_ = 0;            // that came
  std::vector<std::unique_ptr<Reduction>> reductions_;
};

}  // namespace pelorin::photo
