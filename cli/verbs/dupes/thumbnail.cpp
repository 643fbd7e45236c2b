#include "cli/verbs/dupes/thumbnail.h"

#include <algorithm>

#include "cli/frame/photo_files.h"
#include "photo/area_average.h"

namespace pelorin::cli {

std::vector<std::uint8_t> thumbnailOf(const photo::ScannedPhoto& photo, Talk& talk) {
  constexpr std::uint32_t longestSide = 256;
  int scale = 8;
  while (scale > 1 && std::max(photo.width, photo.height) / scale < longestSide) scale /= 2;
  const photo::Photo decoded = loadPhoto({photo.path, {}}, {.scale = scale}, talk);
  const photo::PictureSize size =
      photo::fitWithin({decoded.image->width, decoded.image->height}, {longestSide, longestSide});
  return photo::save(photo::areaAverage(*decoded.image, size), "JPEG", {}, {.quality = 80});
}

}  // namespace pelorin::cli
