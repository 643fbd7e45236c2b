#pragma once

#include <cstddef>
#include <vector>

#include "image_processing/core/pixel_types.h"

namespace pelorin::image_processing {

/// What the pass over the pixels needs to know beside the pixels: the same for a whole picture.
struct TonePass {
  /// Scales a curve over [0, 1] to lightness. @throws std::bad_alloc.
  TonePass(const std::vector<float>& curve, float scale, float vibrance, float ltmBlend,
           float detailGain);

  std::vector<float> curve;  ///< At least 2 samples, in units of L.
  float samplesPerUnit;
  float scale;  ///< L of white.
  float vibrance;
  float ltmBlend;
  float detailGain;
  /// Every number is ordinary, so that vectors and scalars agree: what the vectors ask for.
  bool ordinary;
};

/// Enhances `count` pixels: to Lab, L through the tone curve and, with masks, recombined from
/// smoothed base and detail, back to sRGB with a and b unchanged, then vibrance. Alpha is copied.
/// @param bilateral, ltm  `count` mask values each, or both null for no masks.
/// @param out             written; may be `in`.
/// Never throws and keeps no state. For Mask = float and QuantizedFloat<unsigned char>.
template <typename Mask>
void enhanceRow(const TonePass& pass, const RGBA8Pixel* in, const Mask* bilateral, const Mask* ltm,
                RGBA8Pixel* out, std::size_t count);

/// The definition of `enhanceRow`.
template <typename Mask>
void enhanceRowScalar(const TonePass& pass, const RGBA8Pixel* in, const Mask* bilateral,
                      const Mask* ltm, RGBA8Pixel* out, std::size_t count);

}  // namespace pelorin::image_processing
