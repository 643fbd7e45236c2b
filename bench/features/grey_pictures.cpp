#include "bench/features/grey_pictures.h"

#include <algorithm>
#include <cmath>
#include <vector>

#include "bench/support/per_pixel.h"
#include "tests/support/pictures.h"

namespace pelorin::bench {
namespace {

constexpr std::uint32_t width = 4000, height = 3000;  // of `twelveMegapixels` too

using image_processing::Image;
using test_support::Random;

// Texture of 4-pixel cells with a little grain: nearly every vector of pixels holds a corner.
void drawDetail(Image<unsigned char>& image) {
  Random random(1);
  const std::uint32_t columns = width / 4 + 1;
  std::vector<int> cells(std::size_t{columns} * (height / 4 + 1));
  for (int& cell : cells) cell = 70 + static_cast<int>(random.below(116));
  for (std::uint32_t y = 0; y < height; ++y) {
    for (std::uint32_t x = 0; x < width; ++x) {
      image.row(y)[x] = static_cast<unsigned char>(cells[y / 4 * columns + x / 4] +
                                                   static_cast<int>(random.below(7)));
    }
  }
}

void drawLeaves(Image<unsigned char>& image) {
  Random random(2);
  image.set(128);
  for (int leaf = 0; leaf < 400000; ++leaf) {
    // Small discs are the most frequent: the share of radii above r falls as 1 / r^2.
    const float share = std::max(std::sqrt(random.nextFloat()), 1e-2f);
    const int radius = static_cast<int>(4 / share);
    const int cx = static_cast<int>(random.below(width)),
              cy = static_cast<int>(random.below(height));
    const auto grey = static_cast<unsigned char>(20 + random.below(216));
    for (int y = std::max(cy - radius, 0); y < std::min<int>(cy + radius, height); ++y) {
      for (int x = std::max(cx - radius, 0); x < std::min<int>(cx + radius, width); ++x) {
        if ((x - cx) * (x - cx) + (y - cy) * (y - cy) < radius * radius) image.row(y)[x] = grey;
      }
    }
  }
}

void drawSmooth(Image<unsigned char>& image) {
  Random random(3);
  for (std::uint32_t y = 0; y < height; ++y) {
    for (std::uint32_t x = 0; x < width; ++x) {
      image.row(y)[x] = static_cast<unsigned char>((x + y) / 32 % 200 + 20 + random.below(7));
    }
  }
}

void drawPhoto(Image<unsigned char>& image) {
  const auto* const pixels = twelveMegapixels().data.get();
  for (std::size_t i = 0; i < image.pixelCount(); ++i) image.data.get()[i] = pixels[i].g;
}

}  // namespace

Image<unsigned char> greyPicture(GreyPicture kind) {
  Image<unsigned char> image(width, height);
  switch (kind) {
    case detail:
      drawDetail(image);
      break;
    case leaves:
      drawLeaves(image);
      break;
    case smooth:
      drawSmooth(image);
      break;
    case photo:
      drawPhoto(image);
      break;
  }
  return image;
}

const char* nameOf(GreyPicture kind) {
  constexpr const char* names[] = {"detail", "leaves", "smooth", "photo"};
  return names[kind];
}

}  // namespace pelorin::bench
