#include "image_processing/autoenhance/masks/shaping_tables.h"

#include <cmath>

namespace pelorin::image_processing {

float Power::f(float x) const {
  return std::pow(x, exponent_);
}

float SuperQuadric::f(float x) const {
  const float offset = 2.0f * (x - lo()) / (hi() - lo()) - 1.0f;
  return 1.0f - std::pow(std::fabs(offset), exponent_);
}

}  // namespace pelorin::image_processing
