#pragma once

#include <array>
#include <span>

namespace pelorin::image_processing {

/// Intensity by share of pixels: the inverse of a distribution.
using Quantiles = std::array<float, 256>;

/// The inverse of values: for each of n equally spaced levels 0 ... v[n - 1], the place 0 ... n - 1 where
/// `v` first reaches it, interpolated. Any float is accepted, NaN included; never throws.
/// @param inverse  written; as long as `v`, not the same.
void invert(const Quantiles& v, Quantiles& inverse);

/// The definition of `invert`, for any number of values.
void invertScalar(std::span<const float> v, std::span<float> inverse);

}  // namespace pelorin::image_processing
