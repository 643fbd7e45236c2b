#pragma once

#include <cstdint>
#include <vector>

#include "image_processing/autoenhance/lightness/face_lightness.h"
#include "image_processing/autoenhance/lightness/lightness_histogram.h"
#include "image_processing/core/image.h"
#include "image_processing/core/image_metadata.h"

namespace pelorin::image_processing {

/// What the tone curve needs to know of a photo.
struct ImageStatistics {
  /// Entry i is the share of pixels whose lightness bin is below i; 0 first, about 1 last. Above
  /// 2^24 pixels it ends above 1, because counts stop growing there.
  std::vector<float> cdf;
  /// First entry at which the CDF of the face pixels reaches one half; -1 without face pixels, or
  /// when that is the last entry.
  std::int32_t faceMedianBin = -1;
};

/// Statistics in 50 bins over L in [0, 100]; the last bin holds L = 100 alone. May throw
/// std::bad_alloc; keeps no state.
void analyzeImage(const Image<RGBA8Pixel>& image, const ImageMetadata& metadata,
                  ImageStatistics& statistics);

/// The same where the pixels have been counted, and those of the faces in the same bins.
ImageStatistics analyzeImage(const LightnessHistogramSimd& counted, const FaceLightness& faces);

/// Statistics in `bins` bins (at least 1) over L in [0, scale].
void computeImageStatistics(const Image<RGBA8Pixel>& image, const ImageMetadata& metadata, int bins,
                            float scale, ImageStatistics& statistics);

/// The histogram of L, normalised to a sum of 1 (of 0 for an empty image), and the face median. A
/// pixel in several face boxes counts once for each.
void computeHistograms(const Image<RGBA8Pixel>& image, const ImageMetadata& metadata, int bins,
                       float scale, std::vector<float>& histogram, std::int32_t& faceMedian);

}  // namespace pelorin::image_processing
