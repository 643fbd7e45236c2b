#include "tests/dupe/synthetic_cdfs.h"

#include <algorithm>
#include <cmath>

#include "tests/support/pictures.h"

namespace pelorin::test_support {

using image_processing::GreenCDF;

GreenCDF syntheticCDF(std::uint64_t seed) {
  Random random(seed);
  std::array<float, 256> histogram;
  for (float& bin : histogram) bin = static_cast<float>(1 + random.below(20));
  float pixels = 0.0f;
  for (int hump = 0; hump < 4; ++hump) {
    const int centre = static_cast<int>(random.below(256));
    const int reach = static_cast<int>(8 + random.below(48));
    const float height = static_cast<float>(50 + random.below(400));
    for (int i = std::max(0, centre - reach); i < std::min(256, centre + reach); ++i) {
      histogram[i] += height * (1.0f - static_cast<float>(std::abs(i - centre)) / reach);
    }
  }
  for (const float bin : histogram) pixels += bin;
  GreenCDF cdf;
  image_processing::computeCDFFromCounts(histogram, pixels, cdf);
  return cdf;
}

GreenCDF anotherShot(const GreenCDF& scene, float share, std::uint64_t seed,
                     std::uint64_t* pixelCount) {
  Random random(seed);
  std::array<float, 256> histogram;
  float previous = 0.0f, pixels = 0.0f;
  for (std::size_t i = 0; i < scene.size(); ++i) {
    constexpr float pixelsOfScene = 180'000.0f;
    histogram[i] = std::floor((scene[i] - previous + share * random.nextFloat()) * pixelsOfScene);
    previous = scene[i];
    pixels += histogram[i];
  }
  if (pixelCount != nullptr) *pixelCount = static_cast<std::uint64_t>(pixels);
  GreenCDF cdf;
  image_processing::computeCDFFromCounts(histogram, pixels, cdf);
  return cdf;
}

}  // namespace pelorin::test_support
