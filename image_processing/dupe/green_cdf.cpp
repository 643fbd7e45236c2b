#include "image_processing/dupe/green_cdf.h"

#include <algorithm>
#include <cstddef>

namespace pelorin::image_processing {

void computeCDFFromCounts(const std::array<float, 256>& histogram, float pixelCount,
                          GreenCDF& cdf) {
  const float share = 1.0f / std::max(pixelCount, 1.0f);
  float sum = 0.0f;
  for (std::size_t i = 0; i < cdf.size(); ++i) {
    sum += share * histogram[i];
    cdf[i] = sum;
  }
}

void computeGreenCDFScalar(const Image<RGBA8Pixel>& image, GreenCDF& cdf) {
  std::array<float, 256> histogram{};
  float pixelCount = 0.0f;
  for (Image<RGBA8Pixel>::ImageForwardIterator pixel(image); !pixel.atEnd(); ++pixel) {
    histogram[pixel->g] += 1.0f;
    pixelCount += 1.0f;
  }
  computeCDFFromCounts(histogram, pixelCount, cdf);
}

}  // namespace pelorin::image_processing
