#include "image_processing/filters/looks/direct_look.h"

#include <algorithm>

namespace pelorin::image_processing {
namespace {

bool liesIn(float value, float lowest, float highest) {
  return lowest <= value && value <= highest;  // false for NaN
}

DirectLook::Curve extended(const LookCurve& curve) {
  std::vector<float> samples = curve.samples();
  const std::size_t count = samples.size();
  samples.resize(std::max(count, DirectLook::shortCurve) + 1, samples.back());
  return {std::move(samples), static_cast<std::int32_t>(count) - 1, curve.samplesPerUnit()};
}

std::vector<float> sideBySide(const std::array<DirectLook::Curve, 3>& curves) {
  std::vector<float> fours;
  fours.reserve(4 * curves[0].samples.size());
  for (std::size_t i = 0; i < curves[0].samples.size(); ++i) {
    for (const DirectLook::Curve& curve : curves) fours.push_back(curve.samples[i]);
    fours.push_back(0.0f);
  }
  return fours;
}

}  // namespace

bool DirectLook::canCompute(const Look& look) {
  if (look.vignette != nullptr) {
    if (!liesIn(look.maskAlpha, 0.0f, 1.0f)) return false;
    // The cubic misses the edge value by a residual; this much still keeps values above 0.
    for (const float mask : look.vignette->samples()) {
      if (!liesIn(mask, -0.001f, 1.001f)) return false;
    }
  }
  for (const LookCurve& curve : look.curves) {
    if (curve.samples().size() > 65536) return false;
    for (const float sample : curve.samples()) {
      if (!liesIn(sample, -0x1p20f, 0x1p20f)) return false;
    }
  }
  return true;
}

DirectLook::DirectLook(const Look& ofLook)
    : look(ofLook),
      curves{extended(look.curves[0]), extended(look.curves[1]), extended(look.curves[2])},
      curvesAreShort(std::max({curves[0].last, curves[1].last, curves[2].last}) <
                     static_cast<std::int32_t>(shortCurve)),
      stepsAreEqual(curves[0].last == curves[1].last && curves[0].last == curves[2].last),
      fours(look.mix == ChannelMix::grey && stepsAreEqual ? sideBySide(curves)
                                                          : std::vector<float>()) {}

}  // namespace pelorin::image_processing
