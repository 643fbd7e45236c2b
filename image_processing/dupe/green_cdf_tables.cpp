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

void GreenCounter::add(const RGBA8Pixel* pixels, std::size_t pixelCount) {
  for (std::size_t first = 0; first < pixelCount; first += pixelsPerBlock) {
    Counts counts{};
    count(pixels + first, std::min(pixelsPerBlock, pixelCount - first), counts);
    for (const Histogram& way : counts) {
      for (std::size_t i = 0; i < counts_.size(); ++i) counts_[i] += way[i];
    }
  }
  pixels_ += pixelCount;
}

GreenCDF GreenCounter::cdf() const {
  std::array<float, 256> histogram;
  std::transform(counts_.begin(), counts_.end(), histogram.begin(), asFloatCounter);
  GreenCDF cdf;
  computeCDFFromCounts(histogram, asFloatCounter(pixels_), cdf);
  return cdf;
}

void computeGreenCDF(const Image<RGBA8Pixel>& image, GreenCDF& cdf) {
  GreenCounter counter;
  counter.add(image.data.get(), image.pixelCount());
  cdf = counter.cdf();
}

}  // namespace pelorin::image_processing
