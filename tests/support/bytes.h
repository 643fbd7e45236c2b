#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "image_processing/core/image.h"

namespace pelorin::test_support {

using Bytes = std::vector<std::uint8_t>;

inline Bytes bytesOf(std::string_view text) {
  return {text.begin(), text.end()};
}
inline std::string textOf(const Bytes& bytes) {
  return {bytes.begin(), bytes.end()};
}

/// The packed RGBA bytes of a picture.
inline Bytes rawBytes(const image_processing::Image<image_processing::RGBA8Pixel>& image) {
  const auto* const first = reinterpret_cast<const std::uint8_t*>(image.data.get());
  return Bytes(first, first + image.byteSize());
}

}  // namespace pelorin::test_support
