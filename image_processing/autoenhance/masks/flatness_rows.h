#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "image_processing/autoenhance/masks/gaussian_approximation.h"
#include "image_processing/core/pixel_types.h"

namespace pelorin::image_processing {

// The two loops over pixels on either side of the flatness mask's summed-area table. Both never
// throw and keep no state, and are there for float and QuantizedFloat<unsigned char>.

/// The weight of a difference between lightness and its smoothing: none from 20/255 on, and 1 in
/// all for a window of `side` x `side` pixels without any.
GaussianApproximation<float> flatnessWeight(std::int64_t side);

/// Weighs `count` pixels by the difference between lightness and its smoothing.
template <typename T>
void weighRow(const GaussianApproximation<float>& weight, const float* lightness, const T* smoothed,
              float* weights, std::size_t count);

/// The definition of `weighRow`.
template <typename T>
void weighRowScalar(const GaussianApproximation<float>& weight, const float* lightness,
                    const T* smoothed, float* weights, std::size_t count);

/// The table that shapes shares of flat neighbours, and its samples as an 8-bit mask stores them,
/// each in a word of its own. Holds on to the process's table. @throws std::bad_alloc.
struct FlatnessShape {
  FlatnessShape();

  const std::vector<float>& samples;
  std::vector<std::int32_t> codes;
};

/// Writes `count` pixels of the mask: the sum over each window, which `n` columns and rows of the
/// summed-area table enclose, shaped.
/// @param top, bottom  rows of the table, `n` rows apart; count + n floats each.
template <typename T>
void shapeRow(const float* top, const float* bottom, std::ptrdiff_t n, const FlatnessShape& shape,
              T* mask, std::size_t count);

/// The definition of `shapeRow`.
template <typename T>
void shapeRowScalar(const float* top, const float* bottom, std::ptrdiff_t n,
                    const FlatnessShape& shape, T* mask, std::size_t count);

}  // namespace pelorin::image_processing
