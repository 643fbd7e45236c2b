#include <limits>
#include <new>

#include "photo/file_size.h"
#include "photo/jpeg/jpeg_picture_reader.h"

namespace pelorin::photo {
namespace {

std::unique_ptr<std::uint8_t, DecodedPicture::Free> allocateRgba(std::uint32_t width,
                                                                 std::uint32_t height) {
  const std::uint64_t size = std::uint64_t{width} * height * 4;
  if (size > std::numeric_limits<std::size_t>::max() / 2) throw std::bad_alloc();
  std::unique_ptr<std::uint8_t, DecodedPicture::Free> pixels(
      static_cast<std::uint8_t*>(std::malloc(static_cast<std::size_t>(size))));
  if (pixels == nullptr) throw std::bad_alloc();
  return pixels;
}

}  // namespace

DecodedPicture decodeJpeg(std::span<const std::uint8_t> file, int scale,
                          const DecodeLimits& limits) {
  DecodedPicture picture = {};
  const auto makeRoom = [&](std::uint32_t width, std::uint32_t height) {
    picture = {allocateRgba(width, height), width, height};
    return picture.pixels.get();
  };
  decodeJpegInto(makeRoom, file, scale, limits);
  return picture;
}

void decodeJpegInto(
    const std::function<std::uint8_t*(std::uint32_t width, std::uint32_t height)>& makeRoom,
    std::span<const std::uint8_t> file, int scale, const DecodeLimits& limits) {
  checkFileSize(file.size(), limits);
  JpegPictureReader picture(file, scale, limits, JpegPictureReader::Keep::profile);
  const std::uint32_t height = picture.height();
  picture.read(makeRoom(picture.width(), height), height);
}

}  // namespace pelorin::photo
