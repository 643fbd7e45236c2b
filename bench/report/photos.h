#pragma once

#include <string>

#include "image_processing/core/image.h"

namespace pelorin::bench {

struct PhotoSize {
  std::uint32_t width, height;
  double megapixels() const { return static_cast<double>(width) * height / 1e6; }
};

/// Fills a picture of any size with copies of a photo-like one, so that it costs little to make.
void fillWithPhoto(image_processing::Image<image_processing::RGBA8Pixel>& picture);

/// A folder of equal JPEG files of such a picture, quality 90, and an empty one for results; gone
/// with this.
class PhotoFiles {
 public:
  explicit PhotoFiles(PhotoSize size, int count = 1);
  ~PhotoFiles();
  PhotoFiles(const PhotoFiles&) = delete;
  PhotoFiles& operator=(const PhotoFiles&) = delete;

  std::string folder() const { return folder_ + "/in"; }
  std::string first() const { return folder() + "/0.jpg"; }
  std::string results() const { return folder_ + "/out"; }

 private:
  std::string folder_;
};

}  // namespace pelorin::bench
