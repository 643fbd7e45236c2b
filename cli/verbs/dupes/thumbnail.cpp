#include "cli/verbs/dupes/thumbnail.h"

#include "cli/frame/photo_files.h"
#include "cli/frame/small_picture.h"
#include "photo/area_average.h"

namespace pelorin::cli {

std::vector<std::uint8_t> thumbnailOf(const photo::ScannedPhoto& photo, Talk& talk) {
  constexpr std::uint32_t longestSide = 256;
  const int scale = scaleForSide({photo.width, photo.height}, longestSide);
  const photo::Photo decoded = loadPhoto({photo.path, {}}, {.scale = scale}, talk);
  const photo::PictureSize size =
      photo::fitWithin({decoded.image->width, decoded.image->height}, {longestSide, longestSide});
  return smallJpeg(photo::areaAverage(*decoded.image, size), decoded.metadata, 80);
}

}  // namespace pelorin::cli
