#pragma once

#include "image_processing/core/image.h"
#include "image_processing/dupe/green_cdf.h"

namespace pelorin::image_processing {

// How likely two photos are near-duplicates, two shots of one scene taken a moment apart: a linear
// score in the manner of log odds, larger meaning more likely, 0 the even chance. It has no fixed
// bounds: the same photo twice scores about 3.65, unrelated ones taken a day apart about -7. Pure
// functions; any thread may call, any float is accepted, and nothing is thrown.

/// The weights of the score, each the nearest float to a fitted decimal. Checked by
/// DupeScore.IsTheSumOfItsTermsInOrder.
constexpr float dupeIntercept = 0.87882f;
constexpr float dupeSameOrientationWeight = 1.3892856f;
constexpr float dupeLogTimeWeight = -1.0713097f;  ///< Of log10(|dt| + dupeTimeOffset).
constexpr float dupeDistanceWeight = -6.9303436f;
constexpr float dupeTimeOffset = 0.05f;  ///< In the unit of dt.

/// The score of two photos whose distance is known.
/// @param dt        difference of the capture times, meant in seconds; its sign does not matter,
///                  NaN gives NaN.
/// @param distance  what `exposureInvariantCDFDistance` gave.
float dupeScoreOfDistance(float distance, float dt, bool sameOrientation);

/// The score of two photos by their distributions.
float dupeScoreOfCDFs(const GreenCDF& a, const GreenCDF& b, float dt, bool sameOrientation);

/// The score of two photos. `log10f` is the C library's, so the last digit may differ between
/// platforms.
float dupeStatisticTimeOrientationExposureInvariantKS(const Image<RGBA8Pixel>& image1,
                                                      const Image<RGBA8Pixel>& image2, float dt,
                                                      bool sameOrientation);

/// A time difference beyond which no two photos reach `threshold`, however alike they are; a little
/// longer than need be, so that rounding never hides a pair. Negative when not even photos taken at
/// once reach it, infinite when there is no such time.
double longestDupeTimeDifference(float threshold, bool sameOrientation);

}  // namespace pelorin::image_processing
