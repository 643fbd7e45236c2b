#include "photo/checked_pixels.h"

#include <string>

#include "photo/photo_error.h"

namespace pelorin::photo {
namespace {

[[noreturn]] void refuse(PictureSize size, const std::string& why) {
  throw PhotoError(PhotoError::Kind::tooLarge, "too large: " + std::to_string(size.width) + " x " +
                                                   std::to_string(size.height) + " pixels" + why);
}

}  // namespace

std::uint64_t checkPixels(PictureSize size, const DecodeLimits& limits) {
  const std::uint64_t pixels = std::uint64_t{size.width} * size.height;
  if (pixels > limits.pixels) {
    refuse(size, ", at most " + std::to_string(limits.pixels) + " can be read");
  }
  return pixels;
}

void checkCompressedPixels(PictureSize size, std::size_t bytes, const DecodeLimits& limits) {
  constexpr std::uint64_t perByte = 128;
  const std::uint64_t pixels = std::uint64_t{size.width} * size.height;
  const std::uint64_t ofBytes = perByte * bytes;
  if (pixels > ofBytes && pixels - ofBytes > limits.compressedPixels) {
    refuse(size, " in a file of this size");
  }
}

}  // namespace pelorin::photo
