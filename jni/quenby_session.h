#pragma once

#include <memory>
#include <mutex>
#include <utility>

#include "image_processing/core/image.h"
#include "image_processing/filters/filtered_image.h"

namespace pelorin::quenby {

/// What a Java handle stands for: a copy of a photo and, once the faces are known, its filters. Any
/// thread may call.
class QuenbySession {
 public:
  explicit QuenbySession(image_processing::Image<image_processing::RGBA8Pixel> photo)
      : image(std::make_shared<image_processing::Image<image_processing::RGBA8Pixel>>(
            std::move(photo))) {}

  /// Null before the faces are known. The caller's share keeps it, whatever others replace.
  std::shared_ptr<image_processing::FilteredImage> filteredImage() const {
    const std::lock_guard lock(mutex_);
    return filteredImage_;
  }

  void setFilteredImage(std::shared_ptr<image_processing::FilteredImage> replacement) {
    const std::lock_guard lock(mutex_);
    // The previous one goes with the parameter, after the lock: it may hold hundreds of megabytes.
    filteredImage_.swap(replacement);
  }

  /// A picture of the photo's size with any content, the caller's own until it is given back.
  /// @throws std::bad_alloc when there is no spare one and no memory for another.
  image_processing::Image<image_processing::RGBA8Pixel> takeOutput() {
    std::shared_ptr<image_processing::RGBA8Pixel> spare;
    {
      const std::lock_guard lock(mutex_);
      spare.swap(spareOutput_);
    }
    return {image->width, image->height, std::move(spare)};
  }

  /// Keeps one picture for the next call: the pages of a new one cost more than a copy of it.
  void giveOutputBack(image_processing::Image<image_processing::RGBA8Pixel> output) {
    const std::lock_guard lock(mutex_);
    spareOutput_.swap(output.data);
  }

  std::shared_ptr<image_processing::Image<image_processing::RGBA8Pixel>> image;

 private:
  std::shared_ptr<image_processing::FilteredImage> filteredImage_;
  std::shared_ptr<image_processing::RGBA8Pixel> spareOutput_;
  mutable std::mutex mutex_;  // guards both
};

}  // namespace pelorin::quenby
