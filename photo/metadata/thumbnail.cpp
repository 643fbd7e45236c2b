#include "photo/metadata/thumbnail.h"

#include <algorithm>

#include "photo/area_average.h"
#include "photo/jpeg/jpeg_codec.h"

namespace pelorin::photo {
namespace {

using image_processing::Image;
using image_processing::RGBA8Pixel;

// Four lines of those that a new pixel covers tell its colour.
constexpr std::uint32_t linesForEach = 4;

// The average of some lines of whole pixels around each new one: for pictures that have as many for
// each.
Image<RGBA8Pixel> averageOfLines(const Image<RGBA8Pixel>& picture, PictureSize size) {
  Image<RGBA8Pixel> result(size.width, size.height);
  const std::size_t bytes = std::size_t{picture.width} * 4;
  std::vector<std::uint16_t> sums(bytes);
  for (std::uint32_t y = 0; y < size.height; ++y) {
    const std::uint64_t top = std::uint64_t{y} * picture.height / size.height;
    const std::uint64_t bottom = std::uint64_t{y + 1} * picture.height / size.height;
    std::fill(sums.begin(), sums.end(), std::uint16_t{0});
    for (std::uint32_t i = 0; i < linesForEach; ++i) {
      const std::uint64_t line = top + (2 * i + 1) * (bottom - top) / (2 * linesForEach);
      const auto* samples =
          reinterpret_cast<const std::uint8_t*>(picture.row(static_cast<std::uint32_t>(line)));
      for (std::size_t x = 0; x < bytes; ++x)
        sums[x] = static_cast<std::uint16_t>(sums[x] + samples[x]);
    }
    for (std::uint32_t x = 0; x < size.width; ++x) {
      const std::uint64_t left = std::uint64_t{x} * picture.width / size.width;
      const std::uint64_t right = std::uint64_t{x + 1} * picture.width / size.width;
      std::uint64_t red = 0, green = 0, blue = 0;
      for (std::uint64_t column = left; column < right; ++column) {
        red += sums[4 * column];
        green += sums[4 * column + 1];
        blue += sums[4 * column + 2];
      }
      const std::uint64_t count = (right - left) * linesForEach;
      const auto share = [&](std::uint64_t sum) {
        return static_cast<std::uint8_t>((sum + count / 2) / count);
      };
      result.row(y)[x] = {share(red), share(green), share(blue), 255};
    }
  }
  return result;
}

Image<RGBA8Pixel> scaledTo(const Image<RGBA8Pixel>& picture, PictureSize size) {
  const bool muchLarger =
      picture.width / size.width >= linesForEach && picture.height / size.height >= linesForEach;
  return muchLarger ? averageOfLines(picture, size) : areaAverage(picture, size);
}

// The encoder's JFIF segment stands behind the two bytes of the start mark.
void removeJfif(std::vector<std::uint8_t>& file) {
  if (file.size() > 6 && file[2] == 0xFF && file[3] == 0xE0) {
    const std::ptrdiff_t length = file[4] << 8 | file[5];
    file.erase(file.begin() + 2, file.begin() + 4 + length);
  }
}

}  // namespace

std::optional<Thumbnail> ThumbnailMaker::make(std::uint32_t longerSide, std::size_t room) {
  const PictureSize whole = {picture_.width, picture_.height};
  const PictureSize size = fitWithin(whole, {longerSide, longerSide});
  const Image<RGBA8Pixel> small = scaledTo(picture_, size);
  const auto* pixels = reinterpret_cast<const std::uint8_t*>(small.data.get());
  for (const int quality : {95, 90, 80, 65, 40}) {
    std::vector<std::uint8_t> file =
        encodeJpeg(pixels, size.width, size.height, quality, {}, Chroma::whole);
    removeJfif(file);
    if (file.size() <= room) return Thumbnail{std::move(file), size};
  }
  return std::nullopt;
}

}  // namespace pelorin::photo
