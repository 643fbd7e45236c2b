#include "cli/pictures/grey_picture.h"

#include <algorithm>

#include "image_processing/core/float_to_integer.h"

namespace pelorin::cli {

using image_processing::Image;
using image_processing::RGBA8Pixel;

Image<RGBA8Pixel> greyPicture(const Image<float>& plane) {
  Image<RGBA8Pixel> grey(plane.width, plane.height);
  std::transform(
      plane.data.get(), plane.data.get() + plane.pixelCount(), grey.data.get(), [](float value) {
        const auto shade = image_processing::truncateTo<std::uint8_t>(value * 255.0f + 0.5f);
        return RGBA8Pixel{shade, shade, shade, 255};
      });
  return grey;
}

}  // namespace pelorin::cli
