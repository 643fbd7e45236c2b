#pragma once

#include <cstdint>

#include "image_processing/core/export.h"

namespace pelorin::image_processing {

/// The tuning values every filter receives with an application. A plain record of sixteen 32-bit
/// fields; the slider rewrites `vibrance`, `slider`, `faceTarget`, `detailGain` and `ltmBlend`.
struct FilterConfig {
  float vibrance = 1.0f;           ///< Saturation gain; 1 leaves colours as they are.
  float slider = 0.0f;             ///< Weight of the image's own CDF in the tone curve.
  float faceTarget = -1.0f;        ///< Least output of the curve at the face median; <= 0: off.
  float histogramClipLow = 0.75f;  ///< Bounds of the curve's slope, in multiples of the
  float histogramClipHigh = 8.0f;  ///< identity's.
  float detailGain = 0.2f;         ///< Gain of the detail layer outside the LTM mask.
  float ltmBlend = 0.0f;           ///< Weight of the tone-mapped base inside the LTM mask.
  float detailGainLow = 0.2f;      ///< `detailGain` at slider 0.3.
  float detailGainHigh = 1.0f;     ///< `detailGain` at slider 1; 0 switches the masks off.
  float bilateralRange = 0.7f;     ///< Lightness difference (0 ... 1) that counts as an edge.
  float bilateralSpatialFraction = 0.025f;  ///< Smoothing extent over the shorter image side.
  std::int32_t useBilateralGrid = 1;        ///< 0: the exact bilateral filter.
  float ltmMaskAmount = 1.0f;               ///< The flatness mask is computed when above 0.
  std::int32_t ltmMaskRadius = 8;           ///< Half-size of the flatness window in pixels.
  float ltmBlendLow = 0.5f;                 ///< `ltmBlend` at slider 0.3.
  float ltmBlendHigh = 0.7f;                ///< `ltmBlend` at slider 1.

  friend bool operator==(const FilterConfig&, const FilterConfig&) = default;
};
static_assert(sizeof(FilterConfig) == 64);

/// What an application without wishes of its own passes: every field as above. There before any
/// code runs.
PELORIN_EXPORT extern const FilterConfig defaultFilterConfigValue;

/// Rewrites the five slider-driven fields of `config`. Below 0.3 the whole effect fades in from
/// neutral, above it only grows stronger. `slider` is meant in [0, 1] and is not clamped: the two
/// ramps go on outside.
void updateFilterConfigForSliderValue(float slider, FilterConfig* config);

}  // namespace pelorin::image_processing
