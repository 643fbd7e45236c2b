#pragma once

#include <string>
#include <vector>

#include "image_processing/filters/abstract_filter.h"
#include "image_processing/filters/looks/look.h"
#include "tests/support/filter_state.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {

/// What an initialised filter makes of its session's picture, which is `width` x `height`.
inline Image<RGBA8Pixel> applied(image_processing::AbstractFilter& filter, std::uint32_t width,
                                 std::uint32_t height, const std::string& params) {
  Image<RGBA8Pixel> output(width, height);
  filter.applyConfig(params, image_processing::defaultFilterConfigValue, output);
  return output;
}

/// What a new filter of class `Filter` makes of `picture`.
template <typename Filter>
Image<RGBA8Pixel> applied(const Image<RGBA8Pixel>& picture, const std::string& params = "") {
  Filter filter(stateOf(picture));
  filter.init(params);
  return applied(filter, picture.width, picture.height, params);
}

/// The vignette of a look class, with the 400 samples every filter uses.
template <typename Filter>
image_processing::CubicRadialMask maskOf() {
  float edge, centre, maskRadius, maskAlpha;
  bool applyMask;
  Filter(nullptr).getRadialMaskParameters(edge, centre, maskRadius, maskAlpha, applyMask);
  return {edge, centre, 400};
}

/// The look of a class with its own radius and opacity, and with a vignette unless that is null.
template <typename Filter>
image_processing::Look lookOf(const image_processing::CubicRadialMask* vignette) {
  using image_processing::LookCurve;
  Filter filter(nullptr);
  std::vector<float> red, green, blue;
  filter.getRGBCurves(red, green, blue, "");
  image_processing::Look look{
      {LookCurve(red), LookCurve(green), LookCurve(blue)}, Filter::channelMix, vignette};
  float edge, centre;
  bool applyMask;
  filter.getRadialMaskParameters(edge, centre, look.maskRadius, look.maskAlpha, applyMask);
  return look;
}

}  // namespace pelorin::test_support
