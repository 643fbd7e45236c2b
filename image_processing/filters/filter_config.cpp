#include "image_processing/filters/filter_config.h"

namespace pelorin::image_processing {

constinit const FilterConfig defaultFilterConfigValue{};

void updateFilterConfigForSliderValue(float slider, FilterConfig* config) {
  FilterConfig& c = *config;
  c.slider = slider;
  if (slider < 0.3f) {
    const float t = slider / 0.3f;
    const float u = 1.0f - t;
    c.vibrance = u + t * 1.3f;
    c.faceTarget = u * 0.0f + t * 0.15f;
    c.ltmBlend = u * 0.0f + t * c.ltmBlendLow;
    c.detailGain = u * 0.0f + t * c.detailGainLow;
  } else {
    const float t = (slider - 0.3f) / 0.7f;
    const float u = 1.0f - t;
    c.faceTarget = 0.15f;
    c.vibrance = t * 1.8f + u * 1.3f;
    c.detailGain = c.detailGainLow + t * (c.detailGainHigh - c.detailGainLow);
    c.ltmBlend = t * c.ltmBlendHigh + u * c.ltmBlendLow;
  }
}

}  // namespace pelorin::image_processing
