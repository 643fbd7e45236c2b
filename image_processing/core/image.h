#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <memory>

#include "image_processing/core/checked_size.h"
#include "image_processing/core/huge_pages.h"
#include "image_processing/core/pixel_types.h"
#include "image_processing/core/same_containers.h"

namespace pelorin::image_processing {

/// A picture whose pixels are shared: copying an image copies the reference, never the pixels, and
/// a write through one copy is seen through all. Rows stand back to back, the top row first; the
/// pixel of column x and row y is `data.get()[y * width + x]`.
///
/// Used with `RGBA8Pixel`, `float`, `QuantizedFloat<unsigned char>` and `unsigned char`. Distinct
/// images may be used from distinct threads; pixels are not locked.
template <typename T>
class Image {
 public:
  class ImageForwardIterator;
  class ImageForwardIteratorXY;

  /// Shares `pixels`, which must hold columns x rows elements. Without them allocates that many,
  /// uninitialised: whoever makes an image writes every pixel before one is read.
  /// @throws std::bad_alloc when the pixels do not fit into memory or the address space.
  Image(std::uint32_t columns, std::uint32_t rows, std::shared_ptr<T> pixels = nullptr)
      : data(std::move(pixels)), width(columns), height(rows), bytesPerPixel(sizeof(T)) {
    const std::size_t bytes = checkedProduct(columns, rows, sizeof(T));
    if (data == nullptr) {
      data = std::shared_ptr<T>(new T[bytes / sizeof(T)], std::default_delete<T[]>());
      preferHugePages(data.get(), bytes);
    }
  }

  std::size_t pixelCount() const { return static_cast<std::size_t>(width) * height; }
  std::size_t byteSize() const { return pixelCount() * bytesPerPixel; }

  /// First pixel of row `y`, which must be below `height`.
  T* row(std::uint32_t y) const { return data.get() + static_cast<std::size_t>(y) * width; }

  /// Writes `value` into every pixel.
  void set(const T& value) { std::fill_n(data.get(), pixelCount(), value); }

  std::shared_ptr<T> data;
  std::uint32_t width;
  std::uint32_t height;
  std::uint32_t bytesPerPixel;
};

/// Walks the pixels of an image in storage order. Holds the pixels, so it stays valid when the
/// image is gone.
template <typename T>
class Image<T>::ImageForwardIterator {
 public:
  explicit ImageForwardIterator(const Image& image)
      : pixels_(image.data),
        current_(image.data.get()),
        end_(image.data.get() + image.pixelCount()) {}

  bool atEnd() const { return current_ == end_; }
  T& operator*() const { return *current_; }
  T* operator->() const { return current_; }

  /// Moves to the next pixel; not to be called at the end.
  ImageForwardIterator& operator++() {
    ++current_;
    return *this;
  }

 private:
  std::shared_ptr<T> pixels_;
  T* current_;
  T* end_;
};

/// An `ImageForwardIterator` that knows its column and row, without a division.
template <typename T>
class Image<T>::ImageForwardIteratorXY : public Image<T>::ImageForwardIterator {
 public:
  explicit ImageForwardIteratorXY(const Image& image)
      : ImageForwardIterator(image), x_(0), y_(0), rowWidth_(image.width) {}

  std::uint32_t x() const { return x_; }
  std::uint32_t y() const { return y_; }

  /// Moves to the next pixel; not to be called at the end.
  ImageForwardIteratorXY& operator++() {
    ImageForwardIterator::operator++();
    if (++x_ == rowWidth_) {
      x_ = 0;
      ++y_;
    }
    return *this;
  }

 private:
  std::uint32_t x_;
  std::uint32_t y_;
  std::uint32_t rowWidth_;
};

/// A new image held by a shared pointer, image and reference count in one allocation.
/// @throws std::bad_alloc as the constructor of `Image`.
template <typename T>
std::shared_ptr<Image<T>> makeSharedImage(std::uint32_t width, std::uint32_t height) {
  return std::make_shared<Image<T>>(width, height);
}

}  // namespace pelorin::image_processing
