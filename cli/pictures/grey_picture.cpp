#include "cli/pictures/grey_picture.h"

#include <algorithm>

#include "image_processing/core/float_to_integer.h"

namespace pelorin::cli {

using image_processing::Image;

Image<unsigned char> greyPicture(const Image<float>& plane) {
  Image<unsigned char> grey(plane.width, plane.height);
  std::transform(plane.data.get(), plane.data.get() + plane.pixelCount(), grey.data.get(),
                 [](float value) {
                   return image_processing::truncateTo<unsigned char>(value * 255.0f + 0.5f);
                 });
  return grey;
}

}  // namespace pelorin::cli
