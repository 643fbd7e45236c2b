#include "cli/frame/small_picture.h"

#include <algorithm>

#include "cli/frame/interrupt.h"

namespace pelorin::cli {

int scaleForSide(photo::PictureSize photo, std::uint32_t longestSide) {
  int scale = 8;
  while (scale > 1 && std::max(photo.width, photo.height) / scale < longestSide) scale /= 2;
  return scale;
}

std::vector<std::uint8_t> smallJpeg(
    const image_processing::Image<image_processing::RGBA8Pixel>& picture,
    const photo::Metadata& metadata, int quality) {
  photo::KeepOptions coloursAlone;
  coloursAlone.only.emplace();
  return photo::save(
      picture, "JPEG", metadata,
      {.quality = quality, .stop = interruptToken(), .keep = std::move(coloursAlone)});
}

}  // namespace pelorin::cli
