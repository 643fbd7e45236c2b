#pragma once

#include "image_processing/core/monotonic_table.h"

namespace pelorin::image_processing {

/// x to the power of `exponent`.
class Power : public MonotonicTable<float> {
 public:
  Power(float lo, float hi, std::int32_t count, float exponent)
      : MonotonicTable(lo, hi, count), exponent_(exponent) {
    initTable();
  }
  float f(float x) const override;

 private:
  float exponent_;
};

/// A bump over [lo, hi], lo below hi: 0 at both ends, 1 in the middle, flatter for larger
/// exponents.
class SuperQuadric : public MonotonicTable<float> {
 public:
  SuperQuadric(float lo, float hi, std::int32_t count, float exponent)
      : MonotonicTable(lo, hi, count), exponent_(exponent) {
    initTable();
  }
  float f(float x) const override;

 private:
  float exponent_;
};

}  // namespace pelorin::image_processing
