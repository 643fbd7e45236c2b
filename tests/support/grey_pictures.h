#pragma once

#include <algorithm>
#include <cstdint>
#include <vector>

#include "tests/support/pictures.h"

namespace pelorin::test_support {

using GreyImage = image_processing::Image<unsigned char>;

/// The green channel of a picture.
inline GreyImage greenOf(const Image<RGBA8Pixel>& picture) {
  GreyImage grey(picture.width, picture.height);
  std::transform(picture.data.get(), picture.data.get() + picture.pixelCount(), grey.data.get(),
                 [](const RGBA8Pixel& pixel) { return pixel.g; });
  return grey;
}

inline GreyImage greyNoise(std::uint32_t width, std::uint32_t height, std::uint64_t seed) {
  return greenOf(noisePicture(width, height, seed));
}

inline GreyImage greyPhoto(std::uint32_t width, std::uint32_t height, std::uint64_t seed) {
  return greenOf(photoLikePicture(width, height, seed));
}

inline GreyImage greyFlat(std::uint32_t width, std::uint32_t height, unsigned char value) {
  GreyImage grey(width, height);
  grey.set(value);
  return grey;
}

}  // namespace pelorin::test_support
