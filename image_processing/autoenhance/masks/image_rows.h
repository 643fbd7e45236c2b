#pragma once

#include "image_processing/core/image.h"

namespace pelorin::image_processing {

/// The rows of an image that need never exist as a whole.
template <typename T>
class RowSource {
 public:
  virtual ~RowSource() = default;

  /// The pixels of row `y`; valid until the next call.
  virtual const T* row(std::uint32_t y) = 0;
};

/// The rows of an image that does exist.
template <typename T>
class ImageRows : public RowSource<T> {
 public:
  explicit ImageRows(const Image<T>& image) : image_(image) {}
  const T* row(std::uint32_t y) override { return image_.row(y); }

 private:
  const Image<T>& image_;
};

}  // namespace pelorin::image_processing
