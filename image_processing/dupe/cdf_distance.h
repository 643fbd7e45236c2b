#pragma once

#include <vector>

#include "image_processing/dupe/green_cdf.h"

namespace pelorin::image_processing {

// How far apart the light of two photos is once a difference in exposure is taken out. Everything
// here is pure, so any thread may call it; any float is accepted, NaN included, and no entry
// outside a distribution is read.

/// Stretches the middle of `cdf` to [0, 1]: entry `k` becomes 0, entry 255 - `k` becomes 1, what
/// lies beyond them is clamped. Leaves `cdf` as it is when the middle holds no pixels or `k` is
/// outside 0 ... 128.
void clipCDF(GreenCDF& cdf, int k);

/// The largest difference between `a` and `b` at the entries |k| ... 255 - |k|; 0 when there is no
/// such entry. NaN differences do not count.
float KSTest(const GreenCDF& a, const GreenCDF& b, int k);

/// The inverse of a distribution: for each of n equally spaced levels 0 ... v[n - 1], the place
/// 0 ... n - 1 where `v` reaches it, interpolated; as many entries as `v` has. The last is always
/// n - 1 and the first mostly 0, so inverting twice does not give `v` back.
/// @throws std::bad_alloc.
std::vector<float> invertCDF(const std::vector<float>& v);

/// The gain that brings the intensities behind `a` closest to those behind `b`.
/// @param mapped  unless null, receives `a` as it would be with that gain; may be `&a` or `&b`.
/// @returns the gain; 1 when it cannot be fitted.
float matchCDFDomain(const GreenCDF& a, const GreenCDF& b, GreenCDF* mapped = nullptr);

/// The largest difference left between two photos' distributions after the one that needs the
/// larger gain is brought into the other's exposure, shadows and highlights clipped away; 0 ... 1
/// for distributions. Symmetric except where both gains are equal. Mapping is lossy: a photo's
/// distance to itself is about 0.001, that of an all-black picture 1.
float exposureInvariantCDFDistance(const GreenCDF& a, const GreenCDF& b);

}  // namespace pelorin::image_processing
