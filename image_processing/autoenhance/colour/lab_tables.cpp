#include "image_processing/autoenhance/colour/lab_tables.h"

#include <cmath>

#include "image_processing/autoenhance/colour/lab_constants.h"

namespace pelorin::image_processing {

float XYZ2labTable::f(float x) const {
  if (x > cieEpsilon) return static_cast<float>(std::cbrt(static_cast<double>(x)));
  return (labLOffset + cieKappa * x) / labLGain;
}

float Lab2xzTable::f(float x) const {
  const float cube = (x * x) * x;
  return cube > cieEpsilon ? cube : (labLGain * x - labLOffset) / cieKappa;
}

float Lab2yTable::f(float x) const {
  if (x > cieKappaEpsilon) {
    const float fy = (x + labLOffset) / labLGain;
    return (fy * fy) * fy;
  }
  return x / cieKappa;
}

}  // namespace pelorin::image_processing
