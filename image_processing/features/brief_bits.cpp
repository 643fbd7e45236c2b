#include "image_processing/features/brief_bits.h"

#include "image_processing/features/brief_pattern.h"

namespace pelorin::image_processing {

BriefOffsets briefOffsets(std::uint32_t width) {
  const std::ptrdiff_t stride = width;
  BriefOffsets offsets;
  for (std::size_t i = 0; i < briefPattern.size(); ++i) {
    const BriefPair& pair = briefPattern[i];
    offsets[i] = pair.dy1 * stride + pair.dx1;
    offsets[i + briefPattern.size()] = pair.dy2 * stride + pair.dx2;
  }
  return offsets;
}

std::array<std::uint32_t, 8> briefBitsScalar(const std::uint8_t* center, std::uint32_t width) {
  const std::ptrdiff_t stride = width;
  std::array<std::uint32_t, 8> bits = {};
  for (std::size_t i = 0; i < briefPattern.size(); ++i) {
    const BriefPair& pair = briefPattern[i];
    const std::uint8_t first = center[pair.dy1 * stride + pair.dx1];
    const std::uint8_t second = center[pair.dy2 * stride + pair.dx2];
    if (first < second) bits[i / 32] |= std::uint32_t{1} << (i % 32);
  }
  return bits;
}

}  // namespace pelorin::image_processing
