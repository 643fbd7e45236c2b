#include "image_processing/autoenhance/lightness/tone_curve.h"

#include <algorithm>

#include "image_processing/autoenhance/lightness/cdf.h"

namespace pelorin::image_processing {

void updateCurveForFaces(float target, int faceBin, std::vector<float>& curve) {
  const int bins = static_cast<int>(curve.size()) - 1;
  if (faceBin < 0 || faceBin >= bins || !(target > 0.0f)) return;

  std::vector<float> histogram;
  computeHistogramFromCDF(curve, histogram);
  float deficit = target - curve[faceBin];
  for (int round = 0; round < 10 && deficit > 0.0f; ++round) {
    // Infinite when no bin lies above the face; nothing is taken then.
    const float share = deficit / static_cast<float>(bins - faceBin - 1);
    float collected = 0.0f;
    for (int bin = faceBin + 1; bin < bins; ++bin) {
      const float take = std::min(share, histogram[bin]);
      histogram[bin] -= take;
      collected += take;
    }
    // Bin faceBin itself lies above curve[faceBin] and still gets its part.
    collected = collected / static_cast<float>(faceBin + 1);
    for (int bin = 0; bin <= faceBin; ++bin) histogram[bin] += collected;
    computeCDF(histogram, curve);
    deficit = target - curve[faceBin];
  }
}

void curveMassage(std::vector<float>& curve, float clipLow, float clipHigh, int iterations) {
  std::vector<float> histogram;
  computeHistogramFromCDF(curve, histogram);
  const float bins = static_cast<float>(histogram.size());
  const float low = clipLow / bins;
  const float high = clipHigh / bins;
  for (int iteration = 0; iteration < iterations; ++iteration) {
    double sum = 0.0;
    for (float& share : histogram) {
      share = share < low ? low : share > high ? high : share;
      sum += static_cast<double>(share);
    }
    const double normaliser = 1.0 / sum;
    for (float& share : histogram) share = static_cast<float>(share * normaliser);
    computeCDF(histogram, curve);
  }
}

}  // namespace pelorin::image_processing
