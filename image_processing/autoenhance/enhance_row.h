#pragma once

#include <cstddef>
#include <memory>
#include <vector>

#include "image_processing/autoenhance/colour/companding_steps.h"
#include "image_processing/core/pixel_types.h"

namespace pelorin::image_processing {

/// What the pass over the pixels needs to know beside the pixels: the same for a whole picture.
struct TonePass {
  /// Scales a curve over [0, 1] to lightness. @throws std::bad_alloc.
  TonePass(const std::vector<float>& unitCurve, float labScale, float vibranceGain,
           float toneMappedShare, float gainOfDetail);

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

/// `enhanceRow` for a picture that comes in pieces: what depends on the pass alone is found once, some
/// 40 KB. Any thread may use it.
class PreparedTonePass {
 public:
  /// Holds on to `pass`. @throws std::bad_alloc.
  explicit PreparedTonePass(const TonePass& pass);

  /// As `enhanceRow`, for the same masks.
  template <typename Mask>
  void enhance(const RGBA8Pixel* in, const Mask* bilateral, const Mask* ltm, RGBA8Pixel* out,
               std::size_t count) const;

  /// The tone curve, and its values where the argument is one of a few.
  struct Tables {
#ifdef __EMSCRIPTEN__  // With vectors, each after fy of its step: one load brings both.
    alignas(64) float ofSteps[2 * compandingStepCount];
#else
    alignas(64) float ofSteps[compandingStepCount];  ///< At the L of a step of Y.
#endif
    alignas(64) float ofBytes[256];  ///< At the L that a byte of a mask stands for.
    alignas(64) float samples[65];   ///< The last one repeated to the end.
  };

 private:
  const TonePass& pass_;
  std::unique_ptr<Tables> tables_;  // there when the pass is ordinary; callers' stacks may be small
};

/// The definition of `enhanceRow`.
template <typename Mask>
void enhanceRowScalar(const TonePass& pass, const RGBA8Pixel* in, const Mask* bilateral,
                      const Mask* ltm, RGBA8Pixel* out, std::size_t count);

}  // namespace pelorin::image_processing
