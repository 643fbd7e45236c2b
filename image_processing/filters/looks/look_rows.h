#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

#include "image_processing/core/pixel_types.h"
#include "image_processing/filters/looks/direct_look.h"
#include "image_processing/filters/looks/look.h"
#include "image_processing/filters/looks/look_tables.h"
#include "image_processing/filters/looks/vignette_coordinates.h"
#include "image_processing/filters/looks/vignette_rows.h"

namespace pelorin::image_processing {

/// A look ready to be applied to the rows of a picture, in any order and from any thread.
class LookRows {
 public:
  /// `look` outlives this.
  /// @throws std::bad_alloc when its tables (at most 300 KB, and one float a column and a row) do not
  ///         fit.
  LookRows(const Look& look, std::uint32_t width, std::uint32_t height);

  /// Applies the look to `count` pixels from the first of row `y` on, which may be of several rows.
  /// @param to  written; `from` itself or no part of it.
  /// Never throws.
  void apply(std::uint32_t y, const RGBA8Pixel* from, RGBA8Pixel* to, std::size_t count) const;

 private:
  enum class Way { scalar, table, direct };

  void applyToRow(std::uint32_t y, const RGBA8Pixel* from, RGBA8Pixel* to, std::size_t count) const;

  const Look& look_;
  std::uint32_t width_;
  VignetteCoordinates coordinates_;
  VignetteRows rows_;
  Way way_;
  std::vector<LookTable> tables_;  // one, or one a sample of the vignette
  std::optional<DirectLook> direct_;
};

/// The definition of a look on the first `count` pixels of a row.
/// @param v  the vertical coordinate of the row in the vignette.
void applyLookToRowScalar(const Look& look, const VignetteCoordinates& coordinates, float v,
                          const RGBA8Pixel* from, RGBA8Pixel* to, std::size_t count);

}  // namespace pelorin::image_processing
