#pragma once

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <limits>
#include <string>
#include <vector>

#include "image_processing/autoenhance/masks/grid.h"
#include "tests/support/fingerprint.h"
#include "tests/support/pictures.h"
#include "tests/support/slow_build.h"

namespace pelorin::test_support {

/// A picture and the cells of a grid over it.
struct Geometry {
  std::uint32_t width, height;
  float cellSize;
};

inline const std::vector<Geometry> geometries = {
    {1, 1, 1},   {1, 9, 1},     {9, 1, 1},     {2, 2, 1},
    {5, 4, 2},   {7, 5, 9},     {23, 20, 5},   {64, 48, 3},
    {97, 61, 7}, {160, 90, 4},  {131, 77, 77}, {300, 7, 7},
    {7, 300, 3}, {200, 150, 1}, {640, 3, 3},   {slowBuild ? 3000u : 65500u, 1, 1}};

/// Smooth, rough or odd lightness.
inline Image<float> lightnessOf(const Geometry& g, std::uint64_t seed) {
  Image<float> image(g.width, g.height);
  Random random(seed);
  const auto photo = photoLikePicture(g.width, g.height, seed);
  for (std::size_t i = 0; i < image.pixelCount(); ++i) {
    const float smooth = photo.data.get()[i].g / 255.0f;
    image.data.get()[i] = seed % 3 == 0 ? 0.5f : seed % 3 == 1 ? smooth : random.nextFloat();
  }
  if (seed == 5) {
    for (const float value : {-0.1f, 1.2f, 1e9f, -1e9f, 1.0f, 0.0f, std::nanf(""),
                              std::numeric_limits<float>::infinity()}) {
      image.data.get()[random.below(static_cast<std::uint32_t>(image.pixelCount()))] = value;
    }
  }
  return image;
}

/// An empty grid.
inline image_processing::Grid gridFor(const Geometry& g) {
  const auto cell = static_cast<std::uint32_t>(g.cellSize);
  return image_processing::Grid(std::max(g.width / cell, 1u), std::max(g.height / cell, 1u));
}

inline std::string fingerprint(const image_processing::Grid& grid) {
  return fingerprint(grid.cells.data(), grid.cells.size() * sizeof(image_processing::GridCell));
}

}  // namespace pelorin::test_support
