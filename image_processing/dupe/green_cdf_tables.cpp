#include <algorithm>
#include <cstddef>
#include <cstdint>

#include "image_processing/core/float_counter.h"
#include "image_processing/core/prefetch.h"
#include "image_processing/dupe/green_cdf.h"

namespace pelorin::image_processing {
namespace {

// A counter just written is read back only after some cycles. Neighbouring pixels are mostly alike,
// so each of them counts in a histogram of its own.
constexpr std::size_t ways = 8;
// The last are not used: 4096 bytes apart, counters of two histograms would be taken for one.
using Histogram = std::array<std::uint32_t, 256 + 16>;
using Counts = std::array<Histogram, ways>;

// No counter overflows within one block.
constexpr std::size_t pixelsPerBlock = std::size_t{1} << 31;

void count(const RGBA8Pixel* pixels, std::size_t pixelCount, Counts& counts) {
  constexpr std::size_t pixelsInLine = cacheLine / sizeof(RGBA8Pixel);
  std::size_t i = 0;
  for (; i + pixelsInLine <= pixelCount; i += pixelsInLine) {
    prefetchAhead(pixels + i);
    for (std::size_t x = 0; x < pixelsInLine; ++x) ++counts[x % ways][pixels[i + x].g];
  }
  for (; i < pixelCount; ++i) ++counts[0][pixels[i].g];
}

}  // namespace

void computeGreenCDF(const Image<RGBA8Pixel>& image, GreenCDF& cdf) {
  std::array<std::uint64_t, 256> total{};
  const std::size_t pixelCount = image.pixelCount();
  for (std::size_t first = 0; first < pixelCount; first += pixelsPerBlock) {
    Counts counts{};
    count(image.data.get() + first, std::min(pixelsPerBlock, pixelCount - first), counts);
    for (const Histogram& way : counts) {
      for (std::size_t i = 0; i < total.size(); ++i) total[i] += way[i];
    }
  }
  std::array<float, 256> histogram;
  std::transform(total.begin(), total.end(), histogram.begin(), asFloatCounter);
  computeCDFFromCounts(histogram, asFloatCounter(pixelCount), cdf);
}

}  // namespace pelorin::image_processing
