#include "cli/verbs/corners.h"

#include <fmt/format.h>

#include <algorithm>

#include "image_processing/core/image.h"
#include "image_processing/features/fast_detector.h"

namespace pelorin::cli {

using image_processing::BriefDescriptor;
using image_processing::GreyPixels;
using image_processing::Image;
using image_processing::RGBA8Pixel;
using image_processing::RowSource;

namespace {

// What is known of a corner lies in so many rows above and below it.
constexpr std::uint32_t reach = 16;

// Corners of a strip of a picture; those near its ends may miss neighbours or a descriptor.
std::vector<Corner> cornersOf(const Image<unsigned char>& grey, const CornerSearch& search) {
  const GreyPixels pixels = {grey.data.get(), static_cast<int>(grey.width),
                             static_cast<int>(grey.height), grey.width};
  const auto found = search.suppressed ? detectMaxima(pixels, search.arc, search.threshold)
                                       : detectCorners(pixels, search.arc, search.threshold);
  const auto scores =
      scoreCorners(pixels, found.data(), found.size(), search.arc, search.threshold);
  std::vector<Corner> corners;
  for (std::size_t i = 0; i < found.size(); ++i) {
    corners.push_back({found.data()[i], scores.data()[i], std::nullopt});
  }
  if (!search.described) return corners;

  std::vector<BriefDescriptor> descriptors;
  image_processing::brief(found.data(), static_cast<int>(found.size()), grey, descriptors);
  auto corner = corners.begin();
  for (const BriefDescriptor& described : descriptors) {
    while (corner->position != described.center) ++corner;
    corner->descriptor = described.descriptor;
  }
  return corners;
}

}  // namespace

std::vector<Corner> findCorners(std::uint32_t width, std::uint32_t height, RowSource& rows,
                                const CornerSearch& search) {
  constexpr std::uint32_t stripHeight = 512, rowsRead = 64;
  const Image<unsigned char> room(width, std::min(height, stripHeight));
  const Image<RGBA8Pixel> read(width, std::min(height, rowsRead));
  std::vector<Corner> corners;
  std::uint32_t top = 0, filled = 0;  // of the strip, rows of the picture and of the room
  while (top + filled < height) {
    while (filled < room.height && top + filled < height) {
      const std::uint32_t count = std::min({rowsRead, room.height - filled, height - top - filled});
      const RGBA8Pixel* const pixels = rows.next(count, read.data.get());
      std::transform(pixels, pixels + std::size_t{width} * count, room.row(filled),
                     [](const RGBA8Pixel& pixel) { return pixel.g; });
      filled += count;
    }
    const bool isFirst = top == 0, isLast = top + filled == height;
    const std::uint32_t begin = isFirst ? 0 : reach, end = isLast ? filled : filled - reach;
    for (Corner& corner : cornersOf({width, filled, room.data}, search)) {
      const auto y = static_cast<std::uint32_t>(corner.position.y);
      if (y < begin || y >= end) continue;
      corner.position.y += static_cast<int>(top);
      corners.push_back(corner);
    }
    if (isLast) break;
    const std::uint32_t kept = 2 * reach;
    std::copy(room.row(filled - kept), room.row(filled), room.data.get());
    top += filled - kept;
    filled = kept;
  }
  return corners;
}

std::string hexOf(const Descriptor& descriptor) {
  std::string digits;
  for (auto word = descriptor.rbegin(); word != descriptor.rend(); ++word) {
    digits += fmt::format("{:08x}", *word);
  }
  return digits;
}

}  // namespace pelorin::cli
