#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "image_processing/autoenhance/colour/lab_constants.h"

namespace pelorin::image_processing {

/// Bins and range of the statistics that auto-enhance works with; the last bin holds L = 100 alone.
inline constexpr int lightnessBins = 50;
inline constexpr float lightnessScale = labWhite;

// A pair: `LightnessHistogram` defines what is counted, in any bins; `LightnessHistogramSimd`
// counts whole photos in the bins of `analyzeImage` to the same end.

/// Counts pixels by lightness, in bins over L in [0, scale].
class LightnessHistogram {
 public:
  /// @throws std::bad_alloc; std::invalid_argument for less than one bin.
  LightnessHistogram(int bins, float scale);

  /// Counts `count` pixels, of which `steps` are the companding steps, `times` each. Never throws.
  void add(const std::uint16_t* steps, std::size_t count, std::uint64_t times = 1);

  /// Counts what another histogram with the same bins has counted. Never throws.
  void add(const LightnessHistogram& other);

  bool empty() const;

  /// The share of each bin. @throws std::bad_alloc.
  std::vector<float> normalised() const;

 private:
  std::vector<std::int32_t> binOfStep_;
  std::vector<std::uint64_t> counts_;
};

/// The same with `lightnessBins` over [0, `lightnessScale`], for all pixels of a photo.
class LightnessHistogramSimd {
 public:
  /// @throws std::bad_alloc.
  LightnessHistogramSimd() : counts_(tables * tableSize) {}

  /// Counts `count` pixels of a photo's L / 100. Never throws.
  void add(const float* lightness, std::size_t count);

  /// Counts what another one has counted. Never throws.
  void add(const LightnessHistogramSimd& other);

  /// Pixels in each bin. @throws std::bad_alloc.
  std::vector<std::uint64_t> counts() const;

 private:
  // Two pixels are counted in one place: it is the first's bin plus 64 times the second's. Places
  // of neighbours are often the same: in two tables they need not wait for each other.
  static constexpr std::size_t tables = 2, binsHeld = 64, tableSize = binsHeld * binsHeld;
  static_assert(lightnessBins < binsHeld);  // the last stands for no pixel

  std::vector<std::uint64_t> counts_;
};

/// The share of each bin of so many pixels, as floats find it that count by 1 and so stop at 2^24;
/// all 0 without pixels. @throws std::bad_alloc.
std::vector<float> normalised(const std::vector<std::uint64_t>& counts);

}  // namespace pelorin::image_processing
