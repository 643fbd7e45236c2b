#include "tests/quality/float_images.h"

#include <cstring>

#include "image_processing/quality/niqe_grey.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {

bool sameBytes(const float* a, const float* b, std::size_t count) {
  return count == 0 || std::memcmp(a, b, count * sizeof(float)) == 0;
}

Image<float> greyImage(std::uint32_t width, std::uint32_t height, std::uint64_t seed) {
  const Image<RGBA8Pixel> picture = photoLikePicture(width, height, seed);
  Image<float> grey(width, height);
  image_processing::niqeGreyScalar(picture.data.get(), grey.data.get(), grey.pixelCount());
  return grey;
}

Image<float> coefficients(std::uint32_t width, std::uint32_t height, std::uint64_t seed) {
  Random random(seed);
  Image<float> image(width, height);
  for (std::size_t i = 0; i < image.pixelCount(); ++i)
    image.data.get()[i] = random.below(16) == 0 ? 0.0f : random.nextFloat() * 4.0f - 2.0f;
  return image;
}

}  // namespace pelorin::test_support
