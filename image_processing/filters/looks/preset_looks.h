#pragma once

#include <string>
#include <vector>

#include "image_processing/filters/looks/abstract_rgb_curve_filter.h"
#include "image_processing/filters/looks/look_curves.h"

namespace pelorin::image_processing {

/// A look with stored curves and a vignette from 163/255 in the centre to 22/255 at the edge. `T`
/// names the data: `curves`, `maskRadius` and `maskAlpha`.
template <typename T>
class PresetLookFilter : public AbstractRGBCurveFilter<T> {
 public:
  using AbstractRGBCurveFilter<T>::AbstractRGBCurveFilter;
  static constexpr bool applyMask = true;

  void getRGBCurves(std::vector<float>& red, std::vector<float>& green, std::vector<float>& blue,
                    const std::string&) override {
    red.assign(T::curves[0].begin(), T::curves[0].end());
    green.assign(T::curves[1].begin(), T::curves[1].end());
    blue.assign(T::curves[2].begin(), T::curves[2].end());
  }

  void getRadialMaskParameters(float& edge, float& centre, float& radius, float& alpha,
                               bool& applied) override {
    edge = 22.0f / 255.0f;
    centre = 163.0f / 255.0f;
    radius = T::maskRadius;
    alpha = T::maskAlpha;
    applied = T::applyMask;
  }
};

/// "Snow": black and white with a full vignette.
class ZebraBWFilter : public PresetLookFilter<ZebraBWFilter> {
 public:
  using PresetLookFilter::PresetLookFilter;
  static constexpr ChannelMix channelMix = ChannelMix::grey;
  static constexpr const LookCurves& curves = zebraBWCurves;
  static constexpr float maskRadius = 2.28f, maskAlpha = 1.0f;
};

/// "Winter": cool, with a light vignette.
class WinterRGBFilter : public PresetLookFilter<WinterRGBFilter> {
 public:
  using PresetLookFilter::PresetLookFilter;
  static constexpr const LookCurves& curves = winterCurves;
  static constexpr float maskRadius = 2.28f, maskAlpha = 0.3f;
};

/// "Spring": warm, with a light vignette.
class SpringRGBFilter : public PresetLookFilter<SpringRGBFilter> {
 public:
  using PresetLookFilter::PresetLookFilter;
  static constexpr const LookCurves& curves = springCurves;
  static constexpr float maskRadius = 2.28f, maskAlpha = 0.3f;
};

/// "Fall": bright and energetic, with a light vignette.
class FallRGBFilter : public PresetLookFilter<FallRGBFilter> {
 public:
  using PresetLookFilter::PresetLookFilter;
  static constexpr const LookCurves& curves = fallCurves;
  static constexpr float maskRadius = 2.28f, maskAlpha = 0.3f;
};

/// "Summer": light, with hints of raspberry and a full vignette.
class SummerRGBFilter : public PresetLookFilter<SummerRGBFilter> {
 public:
  using PresetLookFilter::PresetLookFilter;
  static constexpr const LookCurves& curves = summerCurves;
  static constexpr float maskRadius = 2.3f, maskAlpha = 1.0f;
};

/// "Vintage": faded, with mixed channels and a full vignette.
class VintageRGBFilter : public PresetLookFilter<VintageRGBFilter> {
 public:
  using PresetLookFilter::PresetLookFilter;
  static constexpr ChannelMix channelMix = ChannelMix::faded;
  static constexpr const LookCurves& curves = vintageCurves;
  static constexpr float maskRadius = 2.28f, maskAlpha = 1.0f;
};

}  // namespace pelorin::image_processing
