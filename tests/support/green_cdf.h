#pragma once

#include "image_processing/dupe/green_cdf.h"

namespace pelorin::test_support {

/// The distribution of a picture's green bytes, every entry of it written anew.
inline image_processing::GreenCDF cdfOf(
    const image_processing::Image<image_processing::RGBA8Pixel>& picture) {
  image_processing::GreenCDF cdf;
  cdf.fill(-7.0f);
  computeGreenCDF(picture, cdf);
  return cdf;
}

}  // namespace pelorin::test_support
