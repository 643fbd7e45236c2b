#include "image_processing/autoenhance/lightness/build_tone_curve.h"

#include "image_processing/autoenhance/lightness/tone_curve.h"

namespace pelorin::image_processing {

std::vector<float> buildToneCurve(const ImageStatistics& statistics, const FilterConfig& config) {
  const std::vector<float>& cdf = statistics.cdf;
  const float last = static_cast<float>(cdf.size() - 1);
  std::vector<float> curve(cdf.size());
  for (std::size_t i = 0; i < curve.size(); ++i) {
    curve[i] = ((1.0f - config.slider) * static_cast<float>(i)) / last + config.slider * cdf[i];
  }
  updateCurveForFaces(config.faceTarget, statistics.faceMedianBin, curve);
  curveMassage(curve, config.histogramClipLow, config.histogramClipHigh, 20);
  return curve;
}

}  // namespace pelorin::image_processing
