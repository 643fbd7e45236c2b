#pragma once

#include <memory>
#include <mutex>
#include <string>
#include <utility>
#include <vector>

#include "image_processing/filters/abstract_filter.h"
#include "image_processing/filters/looks/apply_look.h"
#include "image_processing/filters/looks/look_parameters.h"
#include "image_processing/filters/looks/look_row_filter.h"

namespace pelorin::image_processing {

/// A look: an optional vignette, a channel mix and one tone curve a channel. `T`, the concrete
/// class, supplies the curves, the vignette's settings and, as `T::channelMix`, the mix; constants
/// that it does not name are those below.
///
/// Every application may override the curves ("r", "g", "b"), for itself only, and the vignette
/// ("maskRadius", "maskAlpha", "applyMask"), for itself and all later ones of the same filter.
/// Several threads may apply one filter at once, each into an output of its own.
template <typename T>
class AbstractRGBCurveFilter : public AbstractFilter {
 public:
  static constexpr ChannelMix channelMix = ChannelMix::none;
  static constexpr float maskRadius = 1.0f, maskAlpha = 1.0f;
  static constexpr bool applyMask = false;

  using AbstractFilter::AbstractFilter;

  static FilterParameters parameters() {
    return lookParameters(T::maskRadius, T::maskAlpha, T::applyMask);
  }

  /// Builds the vignette's table. Reads nothing from the parameters.
  void init(const std::string&) override {
    float edge, centre;
    getRadialMaskParameters(edge, centre, maskRadius_, maskAlpha_, applyMask_);
    radialMask_ = std::make_unique<CubicRadialMask>(edge, centre, radialMaskSamples);
  }

  /// `init` comes first. Throws std::bad_alloc alone.
  void applyConfig(const std::string& params, const FilterConfig&,
                   Image<RGBA8Pixel>& output) override {
    applyLook(lookFor(params), *state->image, output, state->workers);
  }

  static std::unique_ptr<RowFilter> forRows(const RowRequest& request) {
    auto filter = std::make_unique<T>(nullptr);
    filter->init(request.params);
    const Look look = filter->lookFor(request.params);
    return lookRowFilter(look, std::move(filter->radialMask_), request.width, request.height);
  }

  /// What an application with these parameters applies; it borrows the vignette from this filter.
  Look lookFor(const std::string& params) {
    std::vector<float> red, green, blue;
    getRGBCurves(red, green, blue, params);
    parseRGBCurves(red, green, blue, params);
    Look look{{LookCurve(std::move(red)), LookCurve(std::move(green)), LookCurve(std::move(blue))},
              T::channelMix};
    const std::lock_guard lock(maskMutex_);
    parseMaskParameters(maskRadius_, maskAlpha_, applyMask_, params);
    look.maskRadius = maskRadius_;
    look.maskAlpha = maskAlpha_;
    look.vignette = applyMask_ ? radialMask_.get() : nullptr;
    return look;
  }

  /// Replaces the curves that the parameters name, as `replaceCurves` says.
  void parseRGBCurves(std::vector<float>& red, std::vector<float>& green, std::vector<float>& blue,
                      const std::string& params) const {
    replaceCurves(red, green, blue, params);
  }

  /// Replaces the vignette's settings that the parameters name, as `replaceMaskSettings` says.
  void parseMaskParameters(float& radius, float& alpha, bool& applied,
                           const std::string& params) const {
    replaceMaskSettings(radius, alpha, applied, params);
  }

  /// Appends the samples of each curve (at least 2, in 0 ... 255) to an empty vector.
  virtual void getRGBCurves(std::vector<float>& red, std::vector<float>& green,
                            std::vector<float>& blue, const std::string& params) = 0;

  /// The vignette's settings: mask values at the edge and in the centre, and what the parameters
  /// `maskRadius`, `maskAlpha` and `applyMask` are until a parameter string changes them.
  virtual void getRadialMaskParameters(float& edge, float& centre, float& radius, float& alpha,
                                       bool& applied) {
    edge = 0.0f;
    centre = 1.0f;
    radius = T::maskRadius;
    alpha = T::maskAlpha;
    applied = T::applyMask;
  }

 private:
  static constexpr int radialMaskSamples = 400;

  float maskRadius_ = 1.0f;
  float maskAlpha_ = 1.0f;
  bool applyMask_ = false;
  std::unique_ptr<CubicRadialMask> radialMask_;
  std::mutex maskMutex_;  // guards the three settings while the filter is applied
};

}  // namespace pelorin::image_processing
