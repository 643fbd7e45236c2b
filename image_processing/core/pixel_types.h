#pragma once

#include <cstdint>

#include "image_processing/core/float_to_integer.h"

namespace pelorin::image_processing {

/// A pixel in the memory layout of an RGBA_8888 bitmap.
struct RGBA8Pixel {
  std::uint8_t r, g, b, a;

  friend bool operator==(const RGBA8Pixel&, const RGBA8Pixel&) = default;
};
static_assert(sizeof(RGBA8Pixel) == 4);

/// A value in [0, 1] stored in one small unsigned integer; `unsigned char` is the only width used.
template <typename Stored>
class QuantizedFloat;

/// A value in [0, 1] stored as one byte q that stands for q / 255.
template <>
class QuantizedFloat<unsigned char> {
 public:
  static constexpr float codesPerUnit = 255.0f;

  QuantizedFloat() = default;  // uninitialised, as any pixel of a new image

  /// Stores `value` · 255 truncated, its low 8 bits: there is no clamping at the top, so 1.004
  /// wraps to 0. Negative values and NaN store 0.
  /// @returns the stored value read back, so that a chain of assignments sees the quantised value.
  float operator=(float value) {
    stored_ = static_cast<unsigned char>(truncateTo<std::uint32_t>(value * codesPerUnit));
    return *this;
  }

  /// Stored byte / 255; a division, since a multiplication by 1/255 differs for half of the bytes.
  operator float() const { return static_cast<float>(stored_) / codesPerUnit; }

  unsigned char stored() const { return stored_; }

 private:
  unsigned char stored_;
};
static_assert(sizeof(QuantizedFloat<unsigned char>) == 1);

}  // namespace pelorin::image_processing
