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

  std::shared_ptr<image_processing::Image<image_processing::RGBA8Pixel>> image;

 private:
  std::shared_ptr<image_processing::FilteredImage> filteredImage_;
  mutable std::mutex mutex_;  // guards filteredImage_
};

}  // namespace pelorin::quenby
