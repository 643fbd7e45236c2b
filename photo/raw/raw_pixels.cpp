#include "photo/raw/raw_pixels.h"

#include <cstring>
#include <string>

#include "image_processing/core/checked_size.h"
#include "photo/photo_error.h"

namespace pelorin::photo {

using image_processing::Image;
using image_processing::RGBA8Pixel;

std::shared_ptr<Image<RGBA8Pixel>> readRawPixels(std::span<const std::uint8_t> bytes,
                                                 PictureSize size) {
  const std::uint64_t needed =
      image_processing::checkedProduct(size.width, size.height, sizeof(RGBA8Pixel));
  if (bytes.size() != needed) {
    throw PhotoError(PhotoError::Kind::invalidRequest,
                     "holds " + std::to_string(bytes.size()) + " bytes, but " +
                         std::to_string(size.width) + "x" + std::to_string(size.height) +
                         " raw pixels are " + std::to_string(needed) + " bytes");
  }
  auto picture = image_processing::makeSharedImage<RGBA8Pixel>(size.width, size.height);
  std::memcpy(picture->data.get(), bytes.data(), bytes.size());
  return picture;
}

}  // namespace pelorin::photo
