#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "image_processing/autoenhance/colour/lab_constants.h"

namespace pelorin::image_processing {

/// Bins and range of the statistics that auto-enhance works with; the last bin holds L = 100 alone.
inline constexpr int lightnessBins = 50;
inline constexpr float lightnessScale = labWhite;

/// Counts pixels by lightness, in bins over L in [0, scale].
class LightnessHistogram {
 public:
  /// `bins` at least 1. @throws std::bad_alloc.
  LightnessHistogram(int bins, float scale);

  /// Counts `count` pixels, of which `steps` are the companding steps. Never throws.
  void add(const std::uint16_t* steps, std::size_t count);

  bool empty() const;

  /// The share of each bin. @throws std::bad_alloc.
  std::vector<float> normalised() const;

 private:
  std::vector<std::int32_t> binOfStep_;
  std::vector<std::uint64_t> counts_;
};

/// The share of each bin of so many pixels, as floats find it that count by 1 and so stop at 2^24;
/// all 0 without pixels. @throws std::bad_alloc.
std::vector<float> normalised(const std::vector<std::uint64_t>& counts);

}  // namespace pelorin::image_processing
