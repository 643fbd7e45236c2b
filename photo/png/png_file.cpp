#include "photo/png/png_file.h"

#include <png.h>

#include <memory>
#include <string>

namespace pelorin::photo {
namespace {

using image_processing::Image;
using image_processing::RGBA8Pixel;

/// libpng's simple interface keeps its state in a record that must be freed on every way out.
class PngImage {
 public:
  PngImage() : image() { image.version = PNG_IMAGE_VERSION; }
  ~PngImage() { png_image_free(&image); }
  PngImage(const PngImage&) = delete;
  PngImage& operator=(const PngImage&) = delete;

  [[noreturn]] void fail() const { throw PhotoError(PhotoError::Kind::damaged, image.message); }

  png_image image;
};

void checkSize(std::uint64_t width, std::uint64_t height, std::uint64_t bytesPerPixel) {
  if (width == 0 || height == 0)
    throw PhotoError(PhotoError::Kind::invalidRequest, "a picture without pixels");
  // libpng's own macros count bytes in 32 bits.
  constexpr std::uint64_t largest = std::uint64_t{1} << 31;
  if (width > largest || height > largest || width * height > largest / bytesPerPixel)
    throw PhotoError(PhotoError::Kind::tooLarge, "more than 2 GB of pixels");
}

std::vector<std::uint8_t> encode(const void* pixels, std::uint32_t width, std::uint32_t height,
                                 std::uint32_t format) {
  checkSize(width, height, PNG_IMAGE_PIXEL_SIZE(format));
  PngImage png;
  png.image.width = width;
  png.image.height = height;
  png.image.format = format;
  std::vector<std::uint8_t> file(PNG_IMAGE_PNG_SIZE_MAX(png.image));
  png_alloc_size_t size = file.size();
  if (!png_image_write_to_memory(&png.image, file.data(), &size, 0, pixels, 0, nullptr)) png.fail();
  file.resize(size);
  return file;
}

}  // namespace

std::vector<std::uint8_t> encodePng(const Image<RGBA8Pixel>& picture) {
  return encode(picture.data.get(), picture.width, picture.height, PNG_FORMAT_RGBA);
}

std::vector<std::uint8_t> encodePng(const Image<unsigned char>& grey) {
  return encode(grey.data.get(), grey.width, grey.height, PNG_FORMAT_GRAY);
}

Image<RGBA8Pixel> decodePng(std::span<const std::uint8_t> file) {
  PngImage png;
  if (!png_image_begin_read_from_memory(&png.image, file.data(), file.size())) png.fail();
  png.image.format = PNG_FORMAT_RGBA;
  checkSize(png.image.width, png.image.height, sizeof(RGBA8Pixel));
  Image<RGBA8Pixel> picture(png.image.width, png.image.height);
  if (!png_image_finish_read(&png.image, nullptr, picture.data.get(), 0, nullptr)) png.fail();
  return picture;
}

}  // namespace pelorin::photo
