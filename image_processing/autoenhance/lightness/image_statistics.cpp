#include "image_processing/autoenhance/lightness/image_statistics.h"

#include <algorithm>

#include "image_processing/autoenhance/colour/companding_steps.h"
#include "image_processing/autoenhance/lightness/cdf.h"
#include "image_processing/autoenhance/lightness/lightness_histogram.h"
#include "image_processing/autoenhance/lightness/lightness_rows.h"

namespace pelorin::image_processing {
namespace {

void addBox(const Image<RGBA8Pixel>& image, const BoundingBox& box, LightnessHistogram& histogram) {
  const std::int64_t left = std::max<std::int64_t>(box.left, 0);
  const std::int64_t right = std::min<std::int64_t>(box.right, std::int64_t{image.width} - 1);
  const std::int64_t top = std::max<std::int64_t>(box.top, 0);
  const std::int64_t bottom = std::min<std::int64_t>(box.bottom, std::int64_t{image.height} - 1);
  if (left > right) return;
  std::vector<std::uint16_t> steps(right + 1 - left);
  for (std::int64_t y = top; y <= bottom; ++y) {
    compandingSteps(image.row(static_cast<std::uint32_t>(y)) + left, steps.data(), steps.size());
    histogram.add(steps.data(), steps.size());
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

std::int32_t faceMedianBin(const Image<RGBA8Pixel>& image, const ImageMetadata& metadata, int bins,
                           float scale) {
  if (metadata.faces.empty()) return -1;
  LightnessHistogram faces(bins, scale);
  for (const auto& box : metadata.faces) addBox(image, *box, faces);
  return faces.empty() ? -1 : medianBin(faces.normalised());
}

}  // namespace

void analyzeImage(const Image<RGBA8Pixel>& image, const ImageMetadata& metadata,
                  ImageStatistics& statistics) {
  LightnessHistogramSimd counter;
  LightnessRows lightness(image);
  for (std::uint32_t y = 0; y < image.height; ++y) counter.add(lightness.row(y), image.width);
  analyzeImage(counter, image, metadata, statistics);
}

void analyzeImage(const LightnessHistogramSimd& counted, const Image<RGBA8Pixel>& image,
                  const ImageMetadata& metadata, ImageStatistics& statistics) {
  computeCDF(normalised(counted.counts()), statistics.cdf);
  statistics.faceMedianBin = faceMedianBin(image, metadata, lightnessBins, lightnessScale);
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
  std::vector<std::uint16_t> steps(image.width);
  for (std::uint32_t y = 0; y < image.height; ++y) {
    compandingSteps(image.row(y), steps.data(), steps.size());
    all.add(steps.data(), steps.size());
  }
  histogram = all.normalised();
  faceMedian = faceMedianBin(image, metadata, bins, scale);
}

}  // namespace pelorin::image_processing
