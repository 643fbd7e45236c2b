#pragma once

#include "image_processing/autoenhance/colour/lab_constants.h"
#include "image_processing/core/monotonic_table.h"

namespace pelorin::image_processing {

// The companding functions of CIE Lab as tables (CIE 15).

/// X, Y or Z over its white to fx, fy or fz; over [0, 1].
class XYZ2labTable : public MonotonicTable<float> {
 public:
  explicit XYZ2labTable(std::int32_t count) : MonotonicTable(0.0f, 1.0f, count) { initTable(); }
  float f(float x) const override;
};

/// fx or fz to X or Z over its white; over [0, 1].
class Lab2xzTable : public MonotonicTable<float> {
 public:
  explicit Lab2xzTable(std::int32_t count) : MonotonicTable(0.0f, 1.0f, count) { initTable(); }
  float f(float x) const override;
};

/// L to Y over its white; over [0, 100].
class Lab2yTable : public MonotonicTable<float> {
 public:
  explicit Lab2yTable(std::int32_t count) : MonotonicTable(0.0f, labWhite, count) { initTable(); }
  float f(float x) const override;
};

}  // namespace pelorin::image_processing
