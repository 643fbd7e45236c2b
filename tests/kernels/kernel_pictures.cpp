#include "tests/kernels/kernel_pictures.h"

#include <algorithm>
#include <cmath>
#include <vector>

namespace pelorin::test_support {
namespace {

RGBA8Pixel grey(std::uint32_t value) {
  const auto code = static_cast<std::uint8_t>(value);
  return {code, code, code, 255};
}

// Texture of 4-pixel cells with a little grain: nearly every vector of pixels holds a corner.
void drawDetail(Image<RGBA8Pixel>& image) {
  Random random(1);
  const std::uint32_t columns = image.width / 4 + 1;
  std::vector<std::uint32_t> cells(std::size_t{columns} * (image.height / 4 + 1));
  for (std::uint32_t& cell : cells) cell = 70 + random.below(116);
  for (std::uint32_t y = 0; y < image.height; ++y) {
    for (std::uint32_t x = 0; x < image.width; ++x) {
      image.row(y)[x] = grey(cells[y / 4 * columns + x / 4] + random.below(7));
    }
  }
}

void drawLeaves(Image<RGBA8Pixel>& image) {
  Random random(2);
  image.set(grey(128));
  const int width = static_cast<int>(image.width), height = static_cast<int>(image.height);
  for (std::size_t leaf = 0; leaf < image.pixelCount() / 30; ++leaf) {
    // Small discs are the most frequent: the share of radii above r falls as 1 / r^2.
    const float share = std::max(std::sqrt(random.nextFloat()), 1e-2f);
    const int radius = static_cast<int>(4 / share);
    const int cx = static_cast<int>(random.below(image.width));
    const int cy = static_cast<int>(random.below(image.height));
    const RGBA8Pixel pixel = grey(20 + random.below(216));
    for (int y = std::max(cy - radius, 0); y < std::min(cy + radius, height); ++y) {
      for (int x = std::max(cx - radius, 0); x < std::min(cx + radius, width); ++x) {
        if ((x - cx) * (x - cx) + (y - cy) * (y - cy) < radius * radius) image.row(y)[x] = pixel;
      }
    }
  }
}

void drawSmooth(Image<RGBA8Pixel>& image) {
  Random random(3);
  for (std::uint32_t y = 0; y < image.height; ++y) {
    for (std::uint32_t x = 0; x < image.width; ++x) {
      image.row(y)[x] = grey((x + y) / 32 % 200 + 20 + random.below(7));
    }
  }
}

}  // namespace

Image<RGBA8Pixel> pictureOf(PictureKind kind, std::uint32_t width, std::uint32_t height) {
  if (kind == PictureKind::photo) return photoLikePicture(width, height, 12);
  if (kind == PictureKind::noise) return noisePicture(width, height, 1);
  if (kind == PictureKind::oneColour) return flatPicture(width, height, {10, 120, 30, 255});
  Image<RGBA8Pixel> image(width, height);
  if (kind == PictureKind::detail) drawDetail(image);
  if (kind == PictureKind::leaves) drawLeaves(image);
  if (kind == PictureKind::smooth) drawSmooth(image);
  return image;
}

const char* nameOf(PictureKind kind) {
  constexpr const char* names[] = {"photo", "detail", "leaves", "smooth", "one-colour", "noise"};
  return names[static_cast<int>(kind)];
}

}  // namespace pelorin::test_support
