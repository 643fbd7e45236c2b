#pragma once

#include <cstdint>
#include <memory>
#include <utility>

#include "image_processing/core/image.h"

namespace pelorin::photo {

/// The pixels of the last picture, for a next one of as many: the system clears every page of
/// memory that it gives anew. Are they more or fewer, they are freed. For one thread.
class SparePixels {
 public:
  using Picture = image_processing::Image<image_processing::RGBA8Pixel>;

  /// A picture whose pixels are not written yet.
  /// @throws std::bad_alloc.
  std::shared_ptr<Picture> picture(std::uint32_t width, std::uint32_t height) {
    Picture last = std::exchange(spare_, Picture(0, 0));
    const bool fits =
        last.pixelCount() == std::uint64_t{width} * height && last.data.use_count() == 1;
    if (!fits) last.data = nullptr;  // before the new ones are there
    return std::make_shared<Picture>(width, height, std::move(last.data));
  }

  /// Takes the pixels of a picture that has served; of one that others still hold it takes none.
  void keep(Picture picture) { spare_ = std::move(picture); }

 private:
  Picture spare_{0, 0};
};

}  // namespace pelorin::photo
