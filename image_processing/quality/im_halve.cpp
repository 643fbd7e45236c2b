#include "image_processing/quality/im_halve.h"

namespace pelorin::image_processing {

void imHalveScalar(Image<float>& image, std::uint32_t& width, std::uint32_t& height) {
  width /= 2;
  height /= 2;
  for (std::uint32_t y = 0; y < height; ++y) {
    const float* upper = image.row(2 * y);
    const float* lower = image.row(2 * y + 1);
    float* half = image.row(y);  // never after its inputs, so one buffer is enough
    for (std::uint32_t x = 0; x < width; ++x) {
      const std::uint32_t left = 2 * x, right = left + 1;
      half[x] = (((upper[left] + upper[right]) + lower[left]) + lower[right]) * imHalveShare;
    }
  }
}

}  // namespace pelorin::image_processing
