#include "image_processing/autoenhance/lightness/image_statistics.h"

#include "image_processing/autoenhance/colour/companding_steps.h"
#include "image_processing/autoenhance/lightness/cdf.h"
#include "image_processing/autoenhance/lightness/face_lightness.h"
#include "image_processing/autoenhance/lightness/lightness_histogram.h"
#include "image_processing/autoenhance/lightness/lightness_row.h"

namespace pelorin::image_processing {
namespace {

std::int32_t faceMedianBin(const Image<RGBA8Pixel>& image, const ImageMetadata& metadata, int bins,
                           float scale) {
  if (metadata.faces.empty()) return -1;
  FaceLightness faces(metadata, image.width, image.height, bins, scale);
  for (std::uint32_t y = 0; y < image.height; ++y) faces.addRow(y, image.row(y));
  return faces.medianBin();
}

}  // namespace

void analyzeImage(const Image<RGBA8Pixel>& image, const ImageMetadata& metadata,
                  ImageStatistics& statistics) {
  LightnessHistogramSimd counter;
  LightnessRow lightness(image.width);
  for (std::uint32_t y = 0; y < image.height; ++y) {
    counter.add(lightness.of(image.row(y)), image.width);
  }
  computeCDF(normalised(counter.counts()), statistics.cdf);
  statistics.faceMedianBin = faceMedianBin(image, metadata, lightnessBins, lightnessScale);
}

ImageStatistics analyzeImage(const LightnessHistogramSimd& counted, const FaceLightness& faces) {
  ImageStatistics statistics;
  computeCDF(normalised(counted.counts()), statistics.cdf);
  statistics.faceMedianBin = faces.medianBin();
  return statistics;
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
