#pragma once

#include <cstddef>
#include <cstdint>
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

/// Makes thumbnails of one picture, which must outlive it: DCF's kind, without application segments.
class ThumbnailMaker {
 public:
  explicit ThumbnailMaker(const image_processing::Image<image_processing::RGBA8Pixel>& picture)
      : picture_(picture) {}

  /// @param longerSide  in pixels; a smaller picture keeps its size.
  /// @param room        bytes that the file must fit; quality falls from 95 to 40 for it.
  /// @returns nothing when even the lowest quality does not fit.
  std::optional<Thumbnail> make(std::uint32_t longerSide, std::size_t room);

 private:
  const image_processing::Image<image_processing::RGBA8Pixel>& picture_;
};

}  // namespace pelorin::photo
