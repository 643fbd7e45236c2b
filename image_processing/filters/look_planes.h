#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "image_processing/core/pixel_types.h"
#include "image_processing/filters/look.h"

namespace pelorin::image_processing {

/// A curve sample beside the next one, so that one load fetches both.
struct CurveSegment {
  float lower, upper;
};

/// A look computed directly, in short planes of floats that the compiler can put into vectors. The
/// arithmetic is that of the scalar definition without its guards against extraordinary values.
class LookPlanes {
 public:
  /// Whether no channel value can leave its curve and no result the integers: an opacity and mask
  /// samples in 0 ... 1, curves of at most 65536 samples within +-2^20.
  static bool canCompute(const Look& look);

  /// `look` must outlive this and `canCompute` must hold.
  /// @throws std::bad_alloc when 8 bytes for each curve sample do not fit.
  explicit LookPlanes(const Look& look);

  /// Applies the look to at most `lookBlock` pixels; `maskSamples` is read with a vignette only.
  void apply(const RGBA8Pixel* from, RGBA8Pixel* to, std::size_t count,
             const std::int32_t* maskSamples) const;

 private:
  const Look& look_;
  std::array<std::vector<CurveSegment>, 3> segments_;
};

}  // namespace pelorin::image_processing
