#include "tests/support/float_images.h"

#include "tests/support/pictures.h"

namespace pelorin::test_support {

Image<float> constantImage(std::uint32_t width, std::uint32_t height, float value) {
  Image<float> image(width, height);
  image.set(value);
  return image;
}

Image<float> randomImage(std::uint32_t width, std::uint32_t height, std::uint64_t seed) {
  Image<float> image(width, height);
  Random random(seed);
  for (std::size_t i = 0; i < image.pixelCount(); ++i) image.data.get()[i] = random.nextFloat();
  return image;
}

}  // namespace pelorin::test_support
