#pragma once

#include <cstdint>
#include <utility>

#include "image_processing/core/image.h"

namespace pelorin::image_processing {

/// The rows of a picture, of which only the latest are held: row y stands where row y - `held` stood
/// before.
template <typename T>
class RowRing {
 public:
  /// Rows that are not written yet. @throws std::bad_alloc.
  RowRing(std::uint32_t width, std::uint32_t held) : rows_(width, held) {}

  /// All rows of an image, whose pixels are shared.
  explicit RowRing(Image<T> image) : rows_(std::move(image)) {}

  T* row(std::uint32_t y) const { return rows_.row(y % rows_.height); }
  std::uint32_t held() const { return rows_.height; }

 private:
  Image<T> rows_;
};

}  // namespace pelorin::image_processing
