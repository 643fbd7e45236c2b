#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "image_processing/core/pixel_types.h"
#include "image_processing/filters/looks/look.h"
#include "image_processing/filters/looks/vignette_rows.h"

namespace pelorin::image_processing {

/// A look computed pixel by pixel, for mixes and pictures that no table serves. The arithmetic is
/// that of the scalar definition without its guards against extraordinary values.
struct DirectLook {
  /// Whether no channel value can leave its curve and no result the integers: an opacity and mask
  /// samples in 0 ... 1, curves of at most 65536 samples within +-2^20.
  static bool canCompute(const Look& look);

  /// `look` must outlive this and `canCompute` must hold.
  /// @throws std::bad_alloc when the curves' samples do not fit.
  explicit DirectLook(const Look& look);

  /// So many samples, and the last of them once more, fit in a `simd::SmallTable`.
  static constexpr std::size_t shortCurve = 63;

  struct Curve {
    std::vector<float> samples;  ///< Then the last one again: at least one, and up to `shortCurve`.
    std::int32_t last;           ///< Index of the last sample.
    float samplesPerUnit;
  };

  const Look& look;
  std::array<Curve, 3> curves;
  bool curvesAreShort;  ///< None has more than `shortCurve` samples.
  bool stepsAreEqual;   ///< The curves have as many samples each.
  /// The samples of the three curves side by side and a 0, for a grey mix of curves with equal steps;
  /// else empty.
  std::vector<float> fours;
};

/// Applies a look to the first `count` pixels of a row.
/// @param row   read with a vignette only.
/// @param from  `count` pixels.
/// @param to    written; `from` itself or no part of it.
void applyDirectLook(const DirectLook& direct, const VignetteRow& row, const RGBA8Pixel* from,
                     RGBA8Pixel* to, std::size_t count);

}  // namespace pelorin::image_processing
