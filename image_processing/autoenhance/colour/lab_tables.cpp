#include "image_processing/autoenhance/colour/lab_tables.h"

#include <cmath>

namespace pelorin::image_processing {

float XYZ2labTable::f(float x) const {
  if (x > 0.008856f) return static_cast<float>(std::cbrt(static_cast<double>(x)));
  return (16.0f + 903.3f * x) / 116.0f;
}

float Lab2xzTable::f(float x) const {
  const float cube = (x * x) * x;
  return cube > 0.008856f ? cube : (116.0f * x - 16.0f) / 903.3f;
}

float Lab2yTable::f(float x) const {
  if (x > 7.999625f) {  // 903.3 · 0.008856
    const float fy = (x + 16.0f) / 116.0f;
    return (fy * fy) * fy;
  }
  return x / 903.3f;
}

}  // namespace pelorin::image_processing
