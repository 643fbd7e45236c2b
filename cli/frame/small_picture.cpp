#include "cli/frame/small_picture.h"

#include <algorithm>
#include <span>

#include "cli/frame/interrupt.h"

namespace pelorin::cli {
namespace {

using namespace image_processing;

std::uint8_t overWhite(std::uint8_t value, std::uint8_t alpha) {
  return static_cast<std::uint8_t>((value * alpha + 255 * (255 - alpha) + 127) / 255);
}

bool isOpaque(const RGBA8Pixel& pixel) {
  return pixel.a == 255;
}

}  // namespace

int scaleForSide(photo::PictureSize photo, std::uint32_t longestSide) {
  int scale = 8;
  while (scale > 1 && std::max(photo.width, photo.height) / scale < longestSide) scale /= 2;
  return scale;
}

std::vector<std::uint8_t> smallJpeg(const Image<RGBA8Pixel>& picture,
                                    const photo::Metadata& metadata, int quality) {
  const std::span<const RGBA8Pixel> pixels(picture.data.get(), picture.pixelCount());
  if (!std::ranges::all_of(pixels, isOpaque)) {
    Image<RGBA8Pixel> opaque(picture.width, picture.height);
    std::ranges::transform(pixels, opaque.data.get(), [](const RGBA8Pixel& p) -> RGBA8Pixel {
      return {overWhite(p.r, p.a), overWhite(p.g, p.a), overWhite(p.b, p.a), 255};
    });
    return smallJpeg(opaque, metadata, quality);
  }
  photo::KeepOptions coloursAlone;
  coloursAlone.only.emplace();
  return photo::save(
      picture, "JPEG", metadata,
      {.quality = quality, .stop = interruptToken(), .keep = std::move(coloursAlone)});
}

}  // namespace pelorin::cli
