#pragma once

#include <cstddef>
#include <vector>

namespace pelorin::image_processing {

/// A buffer of zeros that starts at the alignment of the widest vector.
/// @throws std::bad_alloc.
class AlignedFloats {
 public:
  explicit AlignedFloats(std::size_t count) : lines_(count / floatsPerLine + 1) {}

  float* data() { return lines_.front().values; }

 private:
  static constexpr std::size_t floatsPerLine = 16;
  struct alignas(64) Line {
    float values[floatsPerLine];
  };

  std::vector<Line> lines_;
};

}  // namespace pelorin::image_processing
