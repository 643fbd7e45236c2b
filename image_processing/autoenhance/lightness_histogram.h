#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <vector>

namespace pelorin::image_processing {

/// Counts pixels by lightness, in bins over L in [0, scale].
class LightnessHistogram {
 public:
  /// `bins` at least 1. @throws std::bad_alloc.
  LightnessHistogram(int bins, float scale);

  /// Counts `count` pixels, of which `steps` are the companding steps. Never throws.
  void add(const std::uint16_t* steps, std::size_t count);

  bool empty() const { return total_ == 0; }

  /// The share of each bin, as floats find it that count by 1 and so stop at 2^24; all 0 when
  /// empty. @throws std::bad_alloc.
  std::vector<float> normalised() const;

 private:
  std::size_t bins_;
  // Only bins that some step falls into are counted: their places fit 16 bits however many bins
  // there are, and the table into the nearest cache.
  std::vector<std::uint16_t> placeOfStep_;
  std::vector<std::int32_t> binOfPlace_;
  // Neighbours mostly fall into one bin: in four histograms they need not wait for each other.
  std::array<std::vector<std::uint64_t>, 4> counts_;
  std::uint64_t total_ = 0;
};

}  // namespace pelorin::image_processing
