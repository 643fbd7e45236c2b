#pragma once

#include <cstddef>
#include <cstdint>

namespace pelorin::image_processing {

/// Draws `count` values of a mask toward 0.5, each by the weight column · row · skin, `times` over:
/// value = 0.5 · weight + (1 - weight) · value.
/// @param columns, skin  `count` floats each, in [0, 1], as is `row`.
/// @param mask           read and written; must not overlap the others.
/// Never throws and keeps no state. For T = float and QuantizedFloat<unsigned char>.
template <typename T>
void blendFaceRow(const float* columns, float row, const float* skin, std::uint64_t times, T* mask,
                  std::size_t count);

/// The definition of `blendFaceRow`.
template <typename T>
void blendFaceRowScalar(const float* columns, float row, const float* skin, std::uint64_t times,
                        T* mask, std::size_t count);

}  // namespace pelorin::image_processing
