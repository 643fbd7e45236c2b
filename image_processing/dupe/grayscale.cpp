#include "image_processing/dupe/grayscale.h"

#include <algorithm>

namespace pelorin::image_processing {

Image<unsigned char> imageMakeGrayscale(const Image<RGBA8Pixel>& image) {
  Image<unsigned char> grey(image.width, image.height);
  const RGBA8Pixel* pixels = image.data.get();
  std::transform(pixels, pixels + image.pixelCount(), grey.data.get(),
                 [](const RGBA8Pixel& pixel) { return pixel.g; });
  return grey;
}

}  // namespace pelorin::image_processing
