#pragma once

#include <cstdint>

#include "image_processing/core/monotonic_table.h"

namespace pelorin::image_processing {

/// The strength of a vignette by squared distance from the centre of the picture: `centre` at 0,
/// falling along a fixed cubic of the distance to `edge` at 1 and beyond. Looked up with the
/// squared distance; read-only, so any thread may.
class CubicRadialMask : public MonotonicTable<float> {
 public:
  /// @param edge    mask value at distance 1 and beyond, to within 1e-6 of `centre` - `edge`.
  /// @param centre  mask value at distance 0.
  /// @param count   number of samples, at least 2.
  /// @throws std::bad_alloc when the samples do not fit.
  CubicRadialMask(float edge, float centre, std::int32_t count);

  /// The mask value at the squared distance `q`, not sampled.
  float f(float q) const override;

 private:
  float edge_;
  float centre_;
};

}  // namespace pelorin::image_processing
