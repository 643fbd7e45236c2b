#include "image_processing/quality/niqe_grey.h"

namespace pelorin::image_processing {

void niqeGreyScalar(const RGBA8Pixel* pixels, float* grey, std::size_t count) {
  for (std::size_t i = 0; i < count; ++i) {
    const RGBA8Pixel& p = pixels[i];
    grey[i] = (p.g * niqeGreen + p.r * niqeRed) + p.b * niqeBlue;
  }
}

}  // namespace pelorin::image_processing
