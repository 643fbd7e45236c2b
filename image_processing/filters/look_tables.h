#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

#include "image_processing/core/pixel_types.h"
#include "image_processing/filters/look.h"

namespace pelorin::image_processing {

/// The output bytes of a look without channel mix: they depend on nothing but the channel, its
/// value and the mask sample, so each is computed once, by the scalar functions.
class LookTables {
 public:
  /// Outputs for the 256 values of each channel.
  using Row = std::array<std::array<std::uint8_t, 256>, 3>;

  /// `look` must outlive the tables and have the mix `none`.
  /// @throws std::bad_alloc when 768 bytes for each mask sample (one row without vignette) do not
  ///         fit.
  explicit LookTables(const Look& look);

  /// The outputs at a mask sample, computed at the first call; 0 without a vignette.
  const Row& at(std::int32_t maskSample) {
    if (!filled_[maskSample]) fill(maskSample);
    return rows_[maskSample];
  }

 private:
  void fill(std::int32_t maskSample);

  const Look& look_;
  std::vector<std::uint8_t> filled_;
  std::unique_ptr<Row[]> rows_;
};

/// Looks up pixels of one mask sample each.
void applyLookTables(LookTables& tables, const RGBA8Pixel* from, RGBA8Pixel* to, std::size_t count,
                     const std::int32_t* maskSamples);

/// Looks up pixels without a vignette.
void applyLookTable(const LookTables::Row& row, const RGBA8Pixel* from, RGBA8Pixel* to,
                    std::size_t count);

}  // namespace pelorin::image_processing
