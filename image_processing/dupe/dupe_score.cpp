#include "image_processing/dupe/dupe_score.h"

#include <algorithm>
#include <cmath>

#include "image_processing/dupe/cdf_distance.h"

namespace pelorin::image_processing {

float dupeScoreOfDistance(float distance, float dt, bool sameOrientation) {
  const float logTime = std::log10(std::fabs(dt) + dupeTimeOffset);
  float score = (sameOrientation ? 1.0f : 0.0f) * dupeSameOrientationWeight;
  score += logTime * dupeLogTimeWeight;
  score += distance * dupeDistanceWeight;
  return score + dupeIntercept;
}

float dupeScoreOfCDFs(const GreenCDF& a, const GreenCDF& b, float dt, bool sameOrientation) {
  return dupeScoreOfDistance(exposureInvariantCDFDistance(a, b), dt, sameOrientation);
}

float dupeStatisticTimeOrientationExposureInvariantKS(const Image<RGBA8Pixel>& image1,
                                                      const Image<RGBA8Pixel>& image2, float dt,
                                                      bool sameOrientation) {
  GreenCDF cdf1, cdf2;
  computeGreenCDF(image1, cdf1);
  computeGreenCDF(image2, cdf2);
  return dupeScoreOfCDFs(cdf1, cdf2, dt, sameOrientation);
}

double longestDupeTimeDifference(float threshold, bool sameOrientation) {
  // The distance is never negative, so time and orientation alone must reach the threshold.
  const double reachable = double{dupeIntercept} +
                           (sameOrientation ? double{dupeSameOrientationWeight} : 0.0) - threshold;
  // Far above what the float sum and log10f can be off, far below what anyone would notice. Beyond
  // 1000 the time is 0 or infinite whatever the slack.
  const double slack = 2e-6 * (8.0 + std::min(std::fabs(double{threshold}), 1000.0));
  return std::pow(10.0, (reachable + slack) / -double{dupeLogTimeWeight}) - dupeTimeOffset;
}

}  // namespace pelorin::image_processing
