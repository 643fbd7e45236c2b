#include "image_processing/autoenhance/lightness/cdf.h"

#include <cstddef>

namespace pelorin::image_processing {

void computeCDF(const std::vector<float>& histogram, std::vector<float>& cdf) {
  cdf.resize(histogram.size() + 1);
  cdf[0] = 0.0f;
  for (std::size_t i = 0; i < histogram.size(); ++i) cdf[i + 1] = cdf[i] + histogram[i];
}

void computeHistogramFromCDF(const std::vector<float>& cdf, std::vector<float>& histogram) {
  histogram.resize(cdf.size() - 1);
  for (std::size_t i = 0; i < histogram.size(); ++i) histogram[i] = cdf[i + 1] - cdf[i];
}

}  // namespace pelorin::image_processing
