#pragma once

#include <vector>

#include "image_processing/autoenhance/lightness/image_statistics.h"
#include "image_processing/autoenhance/masks/image_masks.h"
#include "image_processing/core/image.h"
#include "image_processing/core/workers.h"
#include "image_processing/filters/filter_config.h"

namespace pelorin::image_processing {

/// Enhances a photo: builds its tone curve and applies it to every pixel. Arguments as below.
/// @throws std::bad_alloc; `output` is then untouched.
template <typename TB, typename TL>
void apply(const Image<RGBA8Pixel>& source, const ImageStatistics& statistics,
           const FilterConfig& config, const ImageMasks<TB, TL>& masks, Image<RGBA8Pixel>& output,
           Workers* workers = nullptr);

/// The pass over the pixels: to Lab, L through the tone curve and, with masks, recombined from
/// smoothed base and detail, back to sRGB with a and b unchanged, then vibrance. Alpha is copied.
/// @param output  of the size of `source`; may be the same pixels. When the sizes differ, pixels
///                are walked in storage order until either image ends.
/// @param config  `vibrance`, `detailGain`, `ltmBlend` are used; `detailGainHigh` 0 turns masks
///                off.
/// @param curve   at least 2 samples over [0, 1], in [0, 1].
/// @param scale   L of white, 100.
/// @param masks   of the size of `source`, computed or filled by hand; those that are smaller, were
///                only allocated, or are not there at all, are off.
/// @param workers share the work; null for none.
///
/// Keeps no state; calls with different outputs may run at once. For (float, float) and
/// (QuantizedFloat<unsigned char>, the same).
template <typename TB, typename TL>
void imageVibranceLabAndToneCurve(const Image<RGBA8Pixel>& source, Image<RGBA8Pixel>& output,
                                  const FilterConfig& config, const std::vector<float>& curve,
                                  float scale, const ImageMasks<TB, TL>& masks,
                                  Workers* workers = nullptr);

}  // namespace pelorin::image_processing
