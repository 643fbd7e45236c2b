#pragma once

#include <cstdint>
#include <span>
#include <vector>

namespace pelorin::bench {

/// What no filter of a JPEG file can avoid: libjpeg decodes it, the pixels are copied once, libjpeg
/// encodes them, with its default transforms and quality 90. All memory is made beforehand.
class CodecFloor {
 public:
  /// @param file  a sound JPEG file of that size; it outlives this. libjpeg ends the process at an
  ///              error.
  CodecFloor(std::span<const std::uint8_t> file, std::uint32_t width, std::uint32_t height);

  void run();

 private:
  void decode();
  void encode();
  std::uint8_t* rowOf(std::vector<std::uint8_t>& pixels, std::size_t y) {
    return pixels.data() + y * width_ * 4;
  }

  std::span<const std::uint8_t> file_;
  std::size_t width_, height_;
  std::vector<std::uint8_t> decoded_, copied_, encoded_;
};

}  // namespace pelorin::bench
