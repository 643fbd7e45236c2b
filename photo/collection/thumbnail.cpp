#include "photo/collection/thumbnail.h"

#include <algorithm>

#include "photo/area_average.h"
#include "photo/photo.h"

namespace pelorin::cli {

std::vector<std::uint8_t> thumbnailOf(const ScannedPhoto& photo) {
  constexpr std::uint32_t longestSide = 256;
  int scale = 8;
  while (scale > 1 && std::max(photo.width, photo.height) / scale < longestSide) scale /= 2;
  const Photo decoded = loadPhoto(photo.input, {scale, 0, std::nullopt});
  const PictureSize size =
      fitWithin({decoded.image->width, decoded.image->height}, {longestSide, longestSide});
  const Image<RGBA8Pixel> small = areaAverage(*decoded.image, size);
  return imgproc::encodeJpeg(reinterpret_cast<const std::uint8_t*>(small.data.get()), small.width,
                             small.height, 80);
}

}  // namespace pelorin::cli
