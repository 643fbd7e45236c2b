#include "image_processing/dupe/cdf_distance.h"

#include <algorithm>
#include <cmath>
#include <cstdint>

#include "image_processing/dupe/prepared_cdf.h"
#include "image_processing/dupe/quantiles.h"

namespace pelorin::image_processing {

void clipCDF(GreenCDF& cdf, int k) {
  if (k < 0 || k > 128) return;
  const float low = cdf[k];
  const float range = cdf[255 - k] - low;
  if (range <= 0.0f) return;
  for (float& entry : cdf) entry = std::clamp((entry - low) / range, 0.0f, 1.0f);
}

float KSTest(const GreenCDF& a, const GreenCDF& b, int k) {
  const std::int64_t margin = std::abs(std::int64_t{k});
  float largest = 0.0f;
  for (std::int64_t i = margin; margin <= 127 && i < 256 - margin; ++i) {
    const float difference = std::fabs(a.at(i) - b.at(i));
    if (difference > largest) largest = difference;
  }
  return largest;
}

std::vector<float> invertCDF(const std::vector<float>& v) {
  std::vector<float> inverse(v.size());
  invertScalar(v, inverse);
  return inverse;
}

float matchCDFDomain(const GreenCDF& a, const GreenCDF& b, GreenCDF* mapped) {
  Quantiles quantilesA, quantilesB;
  invert(a, quantilesA);
  invert(b, quantilesB);
  const float gain = fitGain(gainSamplesOf(quantilesA), gainSamplesOf(quantilesB));
  if (mapped != nullptr) *mapped = withGain(quantilesA, gain);
  return gain;
}

float exposureInvariantCDFDistance(const GreenCDF& a, const GreenCDF& b) {
  return exposureInvariantCDFDistance(PreparedCDF(a), PreparedCDF(b));
}

}  // namespace pelorin::image_processing
