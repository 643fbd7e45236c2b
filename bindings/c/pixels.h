#pragma once

#include <cstdint>
#include <memory>
#include <vector>

#include "bindings/c/boundary.h"
#include "image_processing/core/image.h"
#include "photo/faces.h"

namespace pelorin::c_api {

using Picture = image_processing::Image<image_processing::RGBA8Pixel>;
using GreyPicture = image_processing::Image<unsigned char>;

// Pixels of the caller's. @throws std::invalid_argument when they cannot be.

/// Rows of the caller's from `first` on: some, none overlapping the next, all of them within memory.
void requireRows(const void* first, std::uint32_t width, std::uint32_t height, std::size_t stride,
                 std::size_t bytesPerPixel, const char* name);

/// As a picture of its own.
std::shared_ptr<Picture> copyOf(const quenby_pixels* pixels);

/// As a picture to be read and not written, copied only when there are gaps between its rows; the
/// caller's stay where they are meanwhile.
std::shared_ptr<Picture> viewOf(const quenby_pixels* pixels);

/// The same for a grey picture, whose sides fit an int.
GreyPicture viewOf(const quenby_grey* grey);

/// A picture of this size to be written at `rgba`: that memory itself unless there are gaps between
/// its rows. `close` brings the pixels where they belong.
class Output {
 public:
  Output(std::uint8_t* rgba, std::size_t stride, std::uint32_t width, std::uint32_t height);

  Picture& picture() { return picture_; }
  void close();

 private:
  std::uint8_t* rgba_;
  std::size_t stride_;
  Picture picture_;
};

std::vector<photo::Face> facesOf(const quenby_face* faces, std::size_t count);

}  // namespace pelorin::c_api
