#include "image_processing/autoenhance/image_statistics.h"

#include <algorithm>

#include "image_processing/autoenhance/cdf.h"
#include "image_processing/autoenhance/lab.h"

namespace pelorin::image_processing {
namespace {

// Counts as floats do that grow by 1: they stop at 2^24.
float asFloatCount(std::uint64_t count) {
  return static_cast<float>(std::min<std::uint64_t>(count, std::uint64_t{1} << 24));
}

class LightnessHistogram {
 public:
  LightnessHistogram(int bins, float scale)
      : counts_(bins), lastBin_(static_cast<float>(bins - 1)), scale_(scale) {}

  /// Counts the pixels of columns `begin` ... `end` - 1 of a row.
  void addRow(const RGBA8Pixel* row, std::uint32_t begin, std::uint32_t end) {
    const std::int32_t last = static_cast<std::int32_t>(counts_.size()) - 1;
    for (std::uint32_t x = begin; x < end; ++x) {
      const float L = lightnessOf(tables_, row[x].r, row[x].g, row[x].b);
      const std::int32_t bin = truncateTo<std::int32_t>(lastBin_ * L / scale_);
      ++counts_[std::clamp(bin, 0, last)];
    }
    total_ += end - begin;
  }

  bool empty() const { return total_ == 0; }

  std::vector<float> normalised() const {
    const float total = asFloatCount(total_);
    const float share = total == 0.0f ? 1.0f : 1.0f / total;
    std::vector<float> histogram(counts_.size());
    std::transform(counts_.begin(), counts_.end(), histogram.begin(),
                   [share](std::uint64_t count) { return asFloatCount(count) * share; });
    return histogram;
  }

 private:
  const ColourTables& tables_ = colourTables();
  std::vector<std::uint64_t> counts_;
  std::uint64_t total_ = 0;
  float lastBin_;
  float scale_;
};

void addBox(const Image<RGBA8Pixel>& image, const BoundingBox& box, LightnessHistogram& histogram) {
  const std::int64_t left = std::max<std::int64_t>(box.left, 0);
  const std::int64_t right = std::min<std::int64_t>(box.right, std::int64_t{image.width} - 1);
  const std::int64_t top = std::max<std::int64_t>(box.top, 0);
  const std::int64_t bottom = std::min<std::int64_t>(box.bottom, std::int64_t{image.height} - 1);
  if (left > right) return;
  for (std::int64_t y = top; y <= bottom; ++y) {
    histogram.addRow(image.row(static_cast<std::uint32_t>(y)), static_cast<std::uint32_t>(left),
                     static_cast<std::uint32_t>(right + 1));
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
  LightnessHistogram all(bins, scale);
  for (std::uint32_t y = 0; y < image.height; ++y) all.addRow(image.row(y), 0, image.width);
  histogram = all.normalised();

  LightnessHistogram faces(bins, scale);
  for (const auto& box : metadata.faces) addBox(image, *box, faces);
  faceMedian = faces.empty() ? -1 : medianBin(faces.normalised());
}

}  // namespace pelorin::image_processing
