#include "bindings/c/pixels.h"

#include <limits>

#include "photo/filter_photo.h"

namespace pelorin::c_api {

using image_processing::Image;
using image_processing::RGBA8Pixel;

void requireRows(const void* first, std::uint32_t width, std::uint32_t height, std::size_t stride,
                 std::size_t bytesPerPixel, const char* name) {
  if (first == nullptr) refuse(name, "is null");
  if (width == 0 || height == 0) refuse(name, "have no width or no height");
  if (std::uint64_t{width} * bytesPerPixel > stride) refuse(name, "the stride is below the width");
  constexpr auto largest = static_cast<std::size_t>(std::numeric_limits<std::ptrdiff_t>::max());
  if (stride > largest / height) refuse(name, "are more than fit into memory");
}

namespace {

template <typename T>
void copyRows(const void* from, std::size_t fromStride, void* to, std::size_t toStride,
              std::uint32_t width, std::uint32_t height) {
  for (std::uint32_t y = 0; y < height; ++y) {
    std::memcpy(static_cast<char*>(to) + y * toStride,
                static_cast<const char*>(from) + y * fromStride, width * sizeof(T));
  }
}

template <typename T>
Image<T> copied(const void* first, std::uint32_t width, std::uint32_t height, std::size_t stride) {
  Image<T> copy(width, height);
  copyRows<T>(first, stride, copy.data.get(), width * sizeof(T), width, height);
  return copy;
}

// An image that owns nothing.
template <typename T>
Image<T> borrowed(const void* first, std::uint32_t width, std::uint32_t height) {
  T* const pixels = const_cast<T*>(static_cast<const T*>(first));
  return Image<T>(width, height, std::shared_ptr<T>(std::shared_ptr<void>(), pixels));
}

template <typename T>
Image<T> viewed(const void* first, std::uint32_t width, std::uint32_t height, std::size_t stride) {
  return stride == width * sizeof(T) ? borrowed<T>(first, width, height)
                                     : copied<T>(first, width, height, stride);
}

const quenby_pixels& checked(const quenby_pixels* pixels) {
  const quenby_pixels& given = required(pixels, "pixels");
  requireRows(given.rgba, given.width, given.height, given.stride, sizeof(RGBA8Pixel), "pixels");
  return given;
}

Picture pictureAt(std::uint8_t* rgba, std::size_t stride, std::uint32_t width,
                  std::uint32_t height) {
  requireRows(rgba, width, height, stride, sizeof(RGBA8Pixel), "rgba");
  return stride == width * sizeof(RGBA8Pixel) ? borrowed<RGBA8Pixel>(rgba, width, height)
                                              : Picture(width, height);
}

}  // namespace

std::shared_ptr<Picture> copyOf(const quenby_pixels* pixels) {
  const quenby_pixels& given = checked(pixels);
  return std::make_shared<Picture>(
      copied<RGBA8Pixel>(given.rgba, given.width, given.height, given.stride));
}

std::shared_ptr<Picture> viewOf(const quenby_pixels* pixels) {
  const quenby_pixels& given = checked(pixels);
  return std::make_shared<Picture>(
      viewed<RGBA8Pixel>(given.rgba, given.width, given.height, given.stride));
}

GreyPicture viewOf(const quenby_grey* grey) {
  const quenby_grey& given = required(grey, "grey");
  requireRows(given.pixels, given.width, given.height, given.stride, 1, "grey");
  constexpr std::uint32_t largest = std::numeric_limits<std::int32_t>::max();
  if (given.width > largest || given.height > largest) refuse("grey", "a side is above 2147483647");
  return viewed<unsigned char>(given.pixels, given.width, given.height, given.stride);
}

Output::Output(std::uint8_t* rgba, std::size_t stride, std::uint32_t width, std::uint32_t height)
    : rgba_(rgba), stride_(stride), picture_(pictureAt(rgba, stride, width, height)) {}

void Output::close() {
  if (picture_.data.get() == static_cast<void*>(rgba_)) return;
  copyRows<RGBA8Pixel>(picture_.data.get(), picture_.width * sizeof(RGBA8Pixel), rgba_, stride_,
                       picture_.width, picture_.height);
}

std::vector<photo::Face> facesOf(const quenby_face* faces, std::size_t count) {
  array(faces, count, "faces");
  std::vector<photo::Face> all;
  all.reserve(count);
  for (std::size_t i = 0; i < count; ++i) {
    const quenby_face& face = faces[i];
    all.push_back({face.left, face.top, face.right, face.bottom, face.in_pixels != 0});
  }
  photo::requireFinite(all);
  return all;
}

}  // namespace pelorin::c_api
