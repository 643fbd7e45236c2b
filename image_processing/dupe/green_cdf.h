#pragma once

#include <array>

#include "image_processing/core/image.h"

namespace pelorin::image_processing {

/// Cumulative distribution of a photo's green channel: entry i is the share of pixels whose green
/// byte is at most i. Never decreases and ends at 1 up to rounding; all 0 for an empty image.
using GreenCDF = std::array<float, 256>;

/// The distribution of the green bytes of `image`. Counts are those of float counters, which stop
/// at 2^24: a larger image's distribution is distorted and may end above 1. Never throws and keeps
/// no state, so any thread may call it.
void computeGreenCDF(const Image<RGBA8Pixel>& image, GreenCDF& cdf);

/// The definition of `computeGreenCDF`, counted in float.
void computeGreenCDFScalar(const Image<RGBA8Pixel>& image, GreenCDF& cdf);

/// The distribution of a histogram over `pixelCount` pixels, both as float counters hold them.
void computeCDFFromCounts(const std::array<float, 256>& histogram, float pixelCount, GreenCDF& cdf);

}  // namespace pelorin::image_processing
