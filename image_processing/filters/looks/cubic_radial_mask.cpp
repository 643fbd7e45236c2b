#include "image_processing/filters/looks/cubic_radial_mask.h"

#include <cmath>

namespace pelorin::image_processing {

CubicRadialMask::CubicRadialMask(float edge, float centre, std::int32_t count)
    : MonotonicTable(0.0f, 1.0f, count), edge_(edge), centre_(centre) {
  initTable();
}

float CubicRadialMask::f(float q) const {
  const float r = std::sqrt(q);
  const float r2 = r * r;
  const float r3 = r2 * r;
  // Fitted coefficients, used as they are: 1/2, 3/2 and 1 would be another curve.
  const float falloff = 1.0f - 0.49939314f * r - 1.5005553f * r2 + 0.99994844f * r3;
  return edge_ + (centre_ - edge_) * falloff;
}

}  // namespace pelorin::image_processing
