#include "image_processing/autoenhance/lightness/lightness_rows.h"

#include "image_processing/autoenhance/colour/companding_steps.h"

namespace pelorin::image_processing {

LightnessRows::LightnessRows(const Image<RGBA8Pixel>& photo)
    : photo_(photo), steps_(photo.width), lightness_(photo.width) {}

const float* LightnessRows::row(std::uint32_t y) {
  if (y != current_) {
    compandingSteps(photo_.row(y), steps_.data(), steps_.size());
    unitLightness(steps_.data(), lightness_.data(), steps_.size());
    current_ = y;
  }
  return lightness_.data();
}

}  // namespace pelorin::image_processing
