#pragma once

#include <cstdint>
#include <memory>
#include <vector>

#include "image_processing/core/float_to_integer.h"

namespace pelorin::image_processing {

template <typename T>
class MonotonicTable;

/// A function sampled at equal steps over [lo, hi] and looked up at the nearest sample toward lo,
/// without interpolation; arguments outside the domain take the end samples and NaN the first.
/// Copies share the samples. Read-only once filled, so any thread may look up.
template <>
class MonotonicTable<float> {
 public:
  /// The function being sampled.
  virtual float f(float x) const = 0;
  virtual ~MonotonicTable() = default;

  float operator()(float x) const { return (*samples_)[indexOf(x)]; }

  /// Index of the sample a look-up of `x` takes.
  std::int32_t indexOf(float x) const {
    const std::int32_t index = truncateTo<std::int32_t>((x - lo_) * scale_);
    return index < 0 ? 0 : index > count_ - 1 ? count_ - 1 : index;
  }

  const std::vector<float>& samples() const { return *samples_; }

  // What vectors find an index by.
  float lo() const { return lo_; }
  float scale() const { return scale_; }

 protected:
  /// Domain and sample count (at least 2). Leaves the table empty: the most derived constructor
  /// calls `initTable` when the function's own fields are set. May throw std::bad_alloc.
  MonotonicTable(float lo, float hi, std::int32_t count)
      : count_(count),
        samples_(std::make_shared<std::vector<float>>()),
        lo_(lo),
        hi_(hi),
        scale_(static_cast<float>(count - 1) / (hi - lo)) {}
  MonotonicTable(const MonotonicTable&) = default;
  MonotonicTable& operator=(const MonotonicTable&) = default;

  /// Fills the table with f(lo + step · i), the step rounded once.
  void initTable() {
    samples_->reserve(count_);
    const float step = 1.0f / scale_;
    for (std::int32_t i = 0; i < count_; ++i) {
      samples_->push_back(f(lo_ + step * static_cast<float>(i)));
    }
  }

  float hi() const { return hi_; }

 private:
  std::int32_t count_;
  std::shared_ptr<std::vector<float>> samples_;
  float lo_;
  float hi_;
  float scale_;
};

}  // namespace pelorin::image_processing
