// Bytes become two pictures and two sets of arbitrary floats. The counts in tables must be those of
// the definition, the distance of distributions lies in 0 ... 1, and nothing reads out of bounds.
#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "image_processing/dupe/cdf_distance.h"
#include "image_processing/dupe/dupe_score.h"
#include "image_processing/dupe/grayscale.h"

using namespace pelorin::image_processing;

namespace {

void require(bool holds) {
  if (!holds) std::abort();
}

GreenCDF cdfOfPixels(const std::uint8_t* bytes, std::size_t size) {
  const Image<RGBA8Pixel> image(static_cast<std::uint32_t>(size / 4), 1);
  std::memcpy(static_cast<void*>(image.data.get()), bytes, image.byteSize());
  GreenCDF cdf, expected;
  computeGreenCDF(image, cdf);
  computeGreenCDFScalar(image, expected);
  require(std::memcmp(cdf.data(), expected.data(), sizeof cdf) == 0);
  require(imageMakeGrayscale(image).pixelCount() == image.pixelCount());
  return cdf;
}

GreenCDF arbitraryFloats(const std::uint8_t* bytes, std::size_t size) {
  GreenCDF floats{};
  std::memcpy(floats.data(), bytes, std::min(size, sizeof floats));
  return floats;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::size_t half = size / 2;

  const GreenCDF a = cdfOfPixels(data, half), b = cdfOfPixels(data + half, size - half);
  const float distance = exposureInvariantCDFDistance(a, b);
  require(distance >= 0.0f && distance <= 1.001f);
  if (matchCDFDomain(a, b) != matchCDFDomain(b, a)) {
    require(exposureInvariantCDFDistance(b, a) == distance);
  }

  GreenCDF odd = arbitraryFloats(data, half);
  const GreenCDF other = arbitraryFloats(data + half, size - half);
  exposureInvariantCDFDistance(odd, other);
  dupeScoreOfCDFs(odd, other, odd[0], size % 2 == 0);
  require(invertCDF({odd.begin(), odd.begin() + size % 257}).size() == size % 257);
  int k = 0;
  std::memcpy(&k, data, std::min(size, sizeof k));
  for (const int bins : {k, k % 130}) {
    clipCDF(odd, bins);
    KSTest(odd, other, bins);
  }
  return 0;
}
