#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "image_processing/autoenhance/lightness/lightness_histogram.h"

namespace pelorin::image_processing {

/// Counts the pixels of a photo in the bins of `analyzeImage`, faster than a `LightnessHistogram`
/// of them and to the same end.
class LightnessCounter {
 public:
  /// @throws std::bad_alloc.
  LightnessCounter() : counts_(tables * tableSize) {}

  /// Counts `count` pixels of a photo's L / 100. Never throws.
  void add(const float* lightness, std::size_t count);

  /// Pixels in each bin. @throws std::bad_alloc.
  std::vector<std::uint64_t> counts() const;

 private:
  // Two pixels are counted in one place: it is the first's bin plus 64 times the second's. Places
  // of neighbours are often the same: in two tables they need not wait for each other.
  static constexpr std::size_t tables = 2, binsHeld = 64, tableSize = binsHeld * binsHeld;
  static_assert(lightnessBins < binsHeld);  // the last stands for no pixel

  std::vector<std::uint64_t> counts_;
};

}  // namespace pelorin::image_processing
