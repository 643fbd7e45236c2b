#include "image_processing/autoenhance/image_statistics.h"

#include <algorithm>
#include <array>

#include "image_processing/autoenhance/cdf.h"
#include "image_processing/autoenhance/companding_steps.h"

namespace pelorin::image_processing {
namespace {

// Counts as floats do that grow by 1: they stop at 2^24.
float asFloatCount(std::uint64_t count) {
  return static_cast<float>(std::min<std::uint64_t>(count, std::uint64_t{1} << 24));
}

class LightnessHistogram {
 public:
  LightnessHistogram(int bins, float scale, std::uint32_t longestRow)
      : binOfStep_(compandingStepCount), steps_(longestRow) {
    const float lastBin = static_cast<float>(bins - 1);
    for (std::size_t step = 0; step < compandingStepCount; ++step) {
      const float bin = lastBin * lightnessOfSteps()[step] / scale;
      binOfStep_[step] = std::clamp(truncateTo<std::int32_t>(bin), 0, bins - 1);
    }
    for (auto& counts : counts_) counts.resize(bins);
  }

  /// Counts `count` pixels, at most the longest row's.
  void add(const RGBA8Pixel* pixels, std::uint32_t count) {
    compandingSteps(pixels, steps_.data(), count);
    std::uint32_t x = 0;
    for (; x + 4 <= count; x += 4) {
      for (std::uint32_t i = 0; i < 4; ++i) ++counts_[i][binOfStep_[steps_[x + i]]];
    }
    for (; x < count; ++x) ++counts_[0][binOfStep_[steps_[x]]];
    total_ += count;
  }

  bool empty() const { return total_ == 0; }

  std::vector<float> normalised() const {
    const float total = asFloatCount(total_);
    const float share = total == 0.0f ? 1.0f : 1.0f / total;
    std::vector<float> histogram(counts_[0].size());
    for (std::size_t bin = 0; bin < histogram.size(); ++bin) {
      histogram[bin] =
          asFloatCount(counts_[0][bin] + counts_[1][bin] + counts_[2][bin] + counts_[3][bin]) *
          share;
    }
    return histogram;
  }

 private:
  std::vector<std::int32_t> binOfStep_;
  std::vector<std::uint16_t> steps_;
  // Neighbours mostly fall into one bin: in four histograms they need not wait for each other.
  std::array<std::vector<std::uint64_t>, 4> counts_;
  std::uint64_t total_ = 0;
};

void addBox(const Image<RGBA8Pixel>& image, const BoundingBox& box, LightnessHistogram& histogram) {
  const std::int64_t left = std::max<std::int64_t>(box.left, 0);
  const std::int64_t right = std::min<std::int64_t>(box.right, std::int64_t{image.width} - 1);
  const std::int64_t top = std::max<std::int64_t>(box.top, 0);
  const std::int64_t bottom = std::min<std::int64_t>(box.bottom, std::int64_t{image.height} - 1);
  if (left > right) return;
  for (std::int64_t y = top; y <= bottom; ++y) {
    histogram.add(image.row(static_cast<std::uint32_t>(y)) + left,
                  static_cast<std::uint32_t>(right + 1 - left));
  }
}

std::int32_t medianBin(const std::vector<float>& histogram) {
  std::vector<float> cdf;
  computeCDF(histogram, cdf);
  const std::size_t bins = histogram.size();
  std::size_t i = 0;
  while (i < bins && cdf[i] < 0.5f) ++i;
  return i == bins ? -1 : static_cast<std::int32_t>(i);
}

}  // namespace

void analyzeImage(const Image<RGBA8Pixel>& image, const ImageMetadata& metadata,
                  ImageStatistics& statistics) {
  computeImageStatistics(image, metadata, 50, 100.0f, statistics);
}

void computeImageStatistics(const Image<RGBA8Pixel>& image, const ImageMetadata& metadata, int bins,
                            float scale, ImageStatistics& statistics) {
  std::vector<float> histogram;
  std::int32_t faceMedian = -1;
  computeHistograms(image, metadata, bins, scale, histogram, faceMedian);
  computeCDF(histogram, statistics.cdf);
  statistics.faceMedianBin = faceMedian;
}

void computeHistograms(const Image<RGBA8Pixel>& image, const ImageMetadata& metadata, int bins,
                       float scale, std::vector<float>& histogram, std::int32_t& faceMedian) {
  LightnessHistogram all(bins, scale, image.width);
  for (std::uint32_t y = 0; y < image.height; ++y) all.add(image.row(y), image.width);
  histogram = all.normalised();

  LightnessHistogram faces(bins, scale, image.width);
  for (const auto& box : metadata.faces) addBox(image, *box, faces);
  faceMedian = faces.empty() ? -1 : medianBin(faces.normalised());
}

}  // namespace pelorin::image_processing
